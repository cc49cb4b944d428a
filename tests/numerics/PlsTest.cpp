#include <kplib/numerics/KpPls.h>

#include <kplib/foundation/KpDArray.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/shapes/KpLine2D.h>
#include <kplib/volume/KpBitfield.h>

#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <vector>

namespace {

using Points = KpDArray<KpVec2f>;

std::vector<KpVec2f> asVector(const Points& points)
{
    return {points.begin(), points.end()};
}

Points noisyLine(int n, unsigned seed)
{
    std::mt19937 random(seed);
    std::uniform_real_distribution<float> noise(-1, 1);
    Points points;
    for (int i = 0; i < n; ++i)
        points.append(KpVec2f(static_cast<float>(i), 5 * std::sin(static_cast<float>(i) / 9) + noise(random)));
    return points;
}

/// The rules as told, recursively.
void plainDouglasPeucker(const Points& points, std::vector<bool>& marks, long first, long last, float tolerance)
{
    const KpLine2D line(points[first], points[last]);
    if (first == last || line.isEmpty())
        return;
    marks[static_cast<size_t>(first)] = marks[static_cast<size_t>(last)] = true;
    float most = -1;
    long middle = first;
    for (long i = first + 1; i < last; ++i) {
        if (std::abs(line.getDistanceTo(points[i])) > most) {
            most = std::abs(line.getDistanceTo(points[i]));
            middle = i;
        }
    }
    if (most > tolerance) {
        plainDouglasPeucker(points, marks, first, middle, tolerance);
        plainDouglasPeucker(points, marks, middle, last, tolerance);
    }
}

TEST(Pls, douglasPeuckerKeepsWhatTheRulesKeep)
{
    for (const float tolerance : {0.0F, 0.5F, 2.0F, 100.0F, -1.0F}) {
        const Points points = noisyLine(300, 11);
        std::vector<bool> marks(300);
        plainDouglasPeucker(points, marks, 0, 299, tolerance);
        std::vector<KpVec2f> expected;
        for (long i = 0; i < 300; ++i) {
            if (marks[static_cast<size_t>(i)])
                expected.push_back(points[i]);
        }
        Points result;
        KpPls::DouglasPeucker(points, tolerance, result);
        EXPECT_EQ(asVector(result), expected);
    }
}

TEST(Pls, endsThatCoincideNeedTheLoop)
{
    const Points loop({{0, 0}, {2, 0.1F}, {4, 0}, {4, 4}, {0, 4}, {0, 0}});
    Points result({{9, 9}});
    KpPls::DouglasPeucker(loop, 0.5F, result);
    EXPECT_EQ(result.size(), 0);
    KpPls::DouglasPeuckerInLoop(loop, 0.5F, result);
    EXPECT_EQ(asVector(result), (std::vector<KpVec2f>{{0, 0}, {4, 0}, {4, 4}, {0, 4}, {0, 0}}));
    for (const Points& few : {Points(), Points({{1, 1}}), Points({{1, 1}, {1, 1}})}) {
        KpPls::DouglasPeuckerInLoop(few, 0.5F, result);
        EXPECT_EQ(result.size(), 0);
        KpPls::DouglasPeucker(few, 0.5F, result);
        EXPECT_EQ(result.size(), 0);
    }
    // A spiral, where each split takes off a single point.
    Points spiral;
    for (int i = 0; i < 5000; ++i)
        spiral.append(KpVec2f(static_cast<float>(i), i % 2 != 0 ? 0.0F : static_cast<float>(5000 - i)));
    KpPls::DouglasPeucker(spiral, 0, result);
    EXPECT_GT(result.size(), 4500);
}

TEST(Pls, reumannWitkamGoesAlongStrips)
{
    const struct {
        Points points;
        float tolerance;
        std::vector<KpVec2f> kept;
    } cases[] = {
        {{{0, 0}, {1, 0}, {2, 0.1F}, {3, 0}, {3, 1}, {3, 2}}, 0.5F, {{0, 0}, {3, 0}, {3, 2}}},
        {{{0, 0}, {1, 0}, {2, 0}, {3, 0}}, 0.5F, {{0, 0}, {3, 0}}},              // the strip reaches the end
        {{{0, 0}, {0.1F, 0}, {0.1F, 3}, {0.1F, 5}}, 0.5F, {{0, 0}, {0.1F, 5}}},  // a short piece tells no direction
        {{{0, 0}, {0.1F, 0}, {0.2F, 0}}, 5, {{0, 0}, {0.2F, 0}}},
        {{{0, 0}, {1, 0.5F}, {2, 2}}, 0.5F, {{0, 0}, {1, 0.5F}, {2, 2}}},
        {{{3, 3}, {3, 3}}, 9, {{3, 3}, {3, 3}}},
        {{}, 9, {}},
    };
    for (const auto& each : cases) {
        Points result;
        KpPls::ReumannWitkam(each.points, each.tolerance, result);
        EXPECT_EQ(asVector(result), each.kept);
        Points inPlace = each.points;
        KpPls::ReumannWitkam(inPlace, each.tolerance);
        EXPECT_EQ(asVector(inPlace), each.kept);
    }
    const Points points = noisyLine(2000, 12);
    Points result;
    KpPls::ReumannWitkam(points, 3, result);
    EXPECT_TRUE(result[0] == points[0] && result[result.size() - 1] == points[1999]);
    EXPECT_LT(result.size(), 1000);
}

}  // namespace
