#include "SomeVectors.h"

#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpLine.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpPlane.h>

using namespace kplib::test;

namespace {

// Stores all four as they are.
KpPlane raw(const KpVec3f& normal, float distance)
{
    KpPlane plane;
    plane.setNormal(normal);
    plane.setDistanceFromOrigin(distance);
    return plane;
}

TEST(KpPlane, isMadeOfPointsAndNormalsOrEmpty)
{
    const KpVec3f p(1, 2, 3);
    const std::tuple<const char*, KpPlane, KpPlane> cases[] = {
        {"three points", {p, p + x * 2, p + y * 3}, raw(z, 3)},
        {"points on a line", {p, p + x, p + x * 2}, raw(origin, 0)},
        {"the distance isn't scaled", {z * -2, 3}, raw(-z, 3)},
        {"normal and point", {z * -2, p}, raw(-z, -3)},
        {"a normal whose length underflows", {z * 1e-30F, 3}, raw(origin, 0)},
    };
    for (const auto& [what, plane, expected] : cases)
        EXPECT_EQ(plane, expected) << what;
    EXPECT_FALSE(raw(z * 1.0004F, 1).isEmpty() || raw(z * 0.9996F, 1).isEmpty());
    for (const KpPlane& empty : {raw(z * 1.0006F, 1), raw(z * 0.9994F, 1), raw(z, NaN), raw({NaN, 0, 1}, 0)})
        EXPECT_TRUE(empty.isEmpty()) << empty.dump();
    KpPlane plane(z, 2);
    plane.set(-z, plane.normal());
    EXPECT_EQ(plane, raw(-z, -1)) << "through the end of its former normal";
    EXPECT_EQ(raw(z, -3).dump(), R"({"normal":{"x":"0.000000","y":"0.000000","z":"1.000000"},"distance":"-3.000000"})");
}

TEST(KpPlane, measuresPointsAndBoxes)
{
    KpPlane plane(z, -1);
    plane.offset(-1);
    EXPECT_TRUE(plane.isInHalfSpace({5, 5, -2}));
    plane.normalize();
    EXPECT_EQ(plane, raw(-z, 2)) << "faces away from the origin";
    EXPECT_FALSE(plane.isInHalfSpace({5, 5, -1.5F}));
    float min, max;
    KpPlane({-1, -1, -1}, 0.0F).getDistance(KpBox3f(0, 1, 0, 2, -3, 3), min, max);
    EXPECT_FLOAT_EQ(min, -6 / std::sqrt(3.0F));
    EXPECT_FLOAT_EQ(max, 3 / std::sqrt(3.0F));
}

TEST(KpPlane, meetsLinesAndPlanes)
{
    KpVec3f out;
    float t = 5;
    EXPECT_TRUE(KpPlane(z, 2).intersect(KpLine({1, 1, 4}, {1, 1, 5}), out, &t));
    EXPECT_EQ(out, KpVec3f(1, 1, 2));
    EXPECT_FALSE(KpPlane(z, 2).intersect(KpLine(z * 2, z * 2 + x), out, &t)) << "in the plane";
    EXPECT_TRUE(isNaN(out));
    EXPECT_EQ(t, -2);
    KpLine line;
    std::mt19937 random(1);
    for (int i = 0; i < 3000; ++i) {
        const KpPlane a(someVector(random, 1), someVector(random, 10)), b(someVector(random, 1), someVector(random, 9));
        const double sine = KpVec3d(a.normal()).cross(KpVec3d(b.normal())).length();
        ASSERT_TRUE(a.intersect(b, line));
        // Numerators round to 3 of 2^-24 of 2 * 17, and cos 54.7 of the sine is the least that divides them.
        for (const KpPlane& plane : {a, b}) {
            const KpVec3d normal(plane.normal());
            EXPECT_NEAR(normal.dot(KpVec3d(line.position())), plane.distance(), 2e-5 / sine);
            EXPECT_NEAR(normal.dot(KpVec3d(line.direction())), 0, 1e-6 / sine);
        }
        const KpVec3f d = line.direction() * line.direction();
        EXPECT_EQ(line.position()[static_cast<int>(std::max_element(d.begin(), d.end()) - d.begin())], 0);
    }
    EXPECT_TRUE(KpPlane({1, -1, 0}, 1.0F).intersect(KpPlane(z, 1), line)) << "of equals";
    EXPECT_EQ(line.position().x(), 0) << "of equals";
    EXPECT_FALSE(KpPlane(z, 1).intersect(KpPlane({1e-6F, 0, 1}, 1.0F), line));
    EXPECT_EQ(std::tuple(isNaN(line.position()), isNaN(line.direction())), std::tuple(true, true));
}

TEST(KpPlane, movesWithMatrices)
{
    const KpMat4f rigid(0, 1, 0, 0, 0, 0, 1, 0, 1, 0, 0, 0, 1, 2, 3, 1);  // x to y to z to x, and by (1, 2, 3)
    const KpMat4f any(2, 0, 1, 0, 0, 3, 0, 0, 0, 1, 1, 0, 4, 5, 6, 1);
    std::mt19937 random(2);
    for (int i = 0; i < 100; ++i) {
        const KpPlane plane(someVector(random, 1), someVector(random, 5));
        KpPlane moved = plane, movedBack = plane;
        moved.transform(rigid);
        movedBack.transformInv(any);
        const KpVec3f in = plane.getProjectedPoint(someVector(random, 5));
        EXPECT_NEAR(moved.normal().dot(rigid.multVecMatrix(in)), moved.distance(), 2e-5);
        const KpVec3f before = movedBack.getProjectedPoint(someVector(random, 5));
        EXPECT_NEAR(plane.normal().dot(any.multVecMatrix(before)), plane.distance(), 2e-4);
    }
    KpMat4f scale;
    scale.setScale({1, 0, 2});
    KpPlane skewed({1, 0, 1}, 0.0F), flat(y, 1), flatInv(y, 1);
    skewed.transform(scale);
    expectNear(skewed.normal() * std::sqrt(5.0F), {1, 0, 2}, 1e-6F);
    flat.transform(scale);
    flatInv.transformInv(scale);
    EXPECT_EQ(std::tuple(flat, flatInv), std::tuple(KpPlane::emptyPlane(), KpPlane::emptyPlane()));
}

TEST(KpPlane, tellsParallelAndNearlyEqualOnes)
{
    const KpPlane plane(z, 2);
    EXPECT_EQ(plane.getDistance(KpPlane(-z, -5)), std::pair(true, 3.0F));
    const KpVec3f tilted(0.01F, 0, 1), skew(0.02F, 0, 1);  // cosines 0.99995 and 0.9998
    EXPECT_TRUE(plane.isParallel(KpPlane(-tilted, 1)));
    EXPECT_FALSE(plane.isParallel(KpPlane(skew, 1)));
    EXPECT_TRUE(plane.isNearEqualNormal(tilted * 7, true));
    EXPECT_TRUE(plane.isNearEqualNormal(-z, false));
    EXPECT_FALSE(plane.isNearEqualNormal(skew, false) || plane.isNearEqualNormal(-z, true));
    const auto isNear = [&](const KpPlane& other, bool orientationMatters) {
        return plane.isNearEqualInROI(other, {1e9F, 0, 0}, 0, 0.5F, orientationMatters);
    };
    EXPECT_TRUE(isNear({tilted, 2.5F}, true));
    EXPECT_TRUE(isNear({-z, -1.5F}, false));
    EXPECT_FALSE(isNear({z, 2.6F}, true) || isNear({-z, -1.4F}, false) || isNear({-z, -2.0F}, true));
}

}  // namespace
