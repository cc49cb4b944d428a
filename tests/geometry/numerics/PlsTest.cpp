#include <kplib/geometry/numerics/KpPls.h>

#include <kplib/foundation/KpDArray.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/shapes/KpLine2D.h>

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

/// The definition, recursively.
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

/// Short lines on a grid, where many distances are equal to each other and to the tolerance.
TEST(Pls, douglasPeuckerKeepsWhatTheRulesKeep)
{
    std::mt19937 random(11);
    const auto below = [&random](unsigned n) { return static_cast<float>(random() % n); };
    for (int round = 0; round < 3000; ++round) {
        Points points, result;
        for (unsigned i = 0, n = 1 + random() % 12; i < n; ++i)
            points.append(KpVec2f(below(5), below(4)));
        const float tolerance = below(5) - 1;
        std::vector<bool> marks(static_cast<size_t>(points.size()));
        plainDouglasPeucker(points, marks, 0, points.size() - 1, tolerance);
        std::vector<KpVec2f> expected;
        for (long i = 0; i < points.size(); ++i) {
            if (marks[static_cast<size_t>(i)])
                expected.push_back(points[i]);
        }
        KpPls::DouglasPeucker(points, tolerance, result);
        ASSERT_EQ(asVector(result), expected);
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
    KpPls::DouglasPeuckerInLoop(Points({{-3, -4}, {0, 0}, {2, -4}, {-3, -4}}), 9, result);
    EXPECT_EQ(asVector(result), (std::vector<KpVec2f>{{-3, -4}, {0, 0}, {-3, -4}}));  // the first of those 5 away
    for (const Points& few : {Points(), Points({{1, 1}}), Points({{1, 1}, {1, 1}})}) {
        KpPls::DouglasPeuckerInLoop(few, 0.5F, result);
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
        {{{0, 0}, {1, 0}, {2, 0}, {3, 0}}, 0.5F, {{0, 0}, {3, 0}}},               // the strip reaches the end
        {{{0, 0}, {0.1F, 0}, {0.1F, 3}, {0.1F, 5}}, 0.5F, {{0, 0}, {0.1F, 5}}},   // too short for a direction
        {{{0, 0}, {1, 0}, {2, 1}, {3, 0}}, 1, {{0, 0}, {1, 0}, {2, 1}, {3, 0}}},  // just as long, just as far
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
}

}  // namespace
