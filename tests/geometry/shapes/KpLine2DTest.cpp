#include <kplib/geometry/shapes/KpLine2D.h>

#include <gtest/gtest.h>

namespace {

constexpr float nan = std::numeric_limits<float>::quiet_NaN();

TEST(KpLine2D, distancesAreSignedAndEndless)
{
    const KpLine2D line({1, 1}, {4, 5});  // direction (3, 4)
    const std::pair<KpVec2f, float> cases[] = {{{-3, 4}, 5}, {{5, -2}, -5}, {{7, 9}, 0}, {{3, 12}, 5}};
    for (const auto& [p, distance] : cases) {
        EXPECT_FLOAT_EQ(line.getDistanceTo(p), distance) << p;
        EXPECT_FLOAT_EQ(line.getDistance2To(p), distance * distance);
    }
    KpLine2D point;
    point.setPosDir({1, 1}, {0, 0});
    EXPECT_FLOAT_EQ(point.getDistanceTo({4, -3}), 5);
    EXPECT_FLOAT_EQ(point.getDistance2To({4, -3}), 25);
    EXPECT_EQ(std::tuple(point.isEmpty(), KpLine2D().isEmpty(), line.isNotEmpty()), std::tuple(true, true, true));
    point.setPosDir({nan, 0}, {1, 0});
    EXPECT_TRUE(point.isEmpty());
}

TEST(KpLine2D, theClosestPointMayBeKeptInTheSegment)
{
    const KpLine2D line({1, 0}, {3, 0});
    for (const auto& [x, onSegment] : {std::pair(2.0F, 2.0F), {-7.0F, 1.0F}, {9.0F, 3.0F}}) {
        EXPECT_EQ(line.getClosestPoint({x, 5}, false), KpVec2f(x, 0));
        EXPECT_EQ(line.getClosestPoint({x, 5}, true), KpVec2f(onSegment, 0));
    }
    KpLine2D moved({1, 1}, {4, 5});
    moved.translate(5);
    EXPECT_EQ(moved.getCoordinates(), (std::vector<KpVec2f>{{-3, 4}, {0, 8}}));
}

TEST(KpLine2D, intersectionsIncludeTheEndsOfSegments)
{
    const KpLine2D line({0, 0}, {2, 0});
    const std::tuple<KpVec2f, KpVec2f, bool, bool, KpVec2f> cases[] = {
        {{1, -1}, {1, 1}, true, true, {1, 0}},  {{2, 0}, {2, 3}, true, true, {2, 0}},
        {{3, -1}, {3, 1}, true, false, {3, 0}}, {{1, 1}, {1, 2}, true, false, {1, 0}},
        {{0, 1}, {2, 1}, false, false, {9, 9}}, {{0, 0}, {2, 0}, false, false, {9, 9}},
        {{1, 1}, {1, 1}, false, false, {9, 9}}, {{nan, 1}, {1, 0}, false, false, {9, 9}},
        {{0, -1}, {4, 1}, true, true, {2, 0}},
    };
    for (const auto& [from, to, lines, segments, meeting] : cases) {
        const KpLine2D other(from, to);
        KpVec2f at(9, 9);
        EXPECT_EQ(line.intersects(other, &at), lines);
        EXPECT_EQ(at, meeting);
        EXPECT_EQ(line.intersectsSegments(other, nullptr), segments);
        EXPECT_EQ(other.intersectsSegments(line, nullptr), segments);
    }
}

}  // namespace
