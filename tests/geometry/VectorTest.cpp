#include "SomeVectors.h"

#include <kplib/geometry/KpBox2f.h>
#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpBox3i.h>
#include <kplib/geometry/KpFuzzyCompare.h>
#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/MathUtils.h>

using namespace kplib::test;

namespace {

TEST(KpVec, normalizesByItsOwnKindOfLength)
{
    KpVec3f v(2, -3, 6), tiny(1e-30F, 0, 0);
    EXPECT_EQ(v.normalize(), 7);
    EXPECT_EQ(v, KpVec3f(2.0F / 7, -3.0F / 7, 6.0F / 7));
    EXPECT_EQ(tiny.normalize(), 0) << "its squares vanish";
    EXPECT_EQ(tiny.x(), 1e-30F) << "its squares vanish";
    KpVec2f large(3e30F, -4e30F), zero(0, 0);
    EXPECT_FLOAT_EQ(large.normalize(), 5e30F) << "its squares would not fit in a float";
    EXPECT_FLOAT_EQ(large.y(), -0.8F);
    EXPECT_EQ(zero.normalize(), 0);
    EXPECT_EQ(zero, KpVec2f(0, 0));
    EXPECT_EQ(KpVec3f(1e8F, 1, -1e8F).dot(KpVec3f(1, 1, 1)), 0) << "x and y first, in float";
}

TEST(KpVec, getClosestAxisPrefersTheFirstOfEquals)
{
    const std::pair<KpVec3f, KpVec3f> cases[] = {
        {origin, x}, {{-1, -1, -1}, -x}, {{0, -3, 3}, -y}, {{-1, 0.5F, -1.5F}, -z}, {{0, 1, NaN}, origin},
    };
    for (const auto& [vector, axis] : cases)
        EXPECT_EQ(vector.getClosestAxis(), axis) << vector;
}

TEST(KpVec, anglesAreBounded)
{
    EXPECT_FLOAT_EQ(KpVec2f(1, 0).angle(KpVec2f(0, -3)), 1.5707964F);
    EXPECT_TRUE(std::isnan(KpVec2f(0, 0).angle(KpVec2f(1, 0))));
    const KpVec3f up(0, 0, 3);
    EXPECT_FLOAT_EQ(MathUtils::angleBetweenVectors(y * 0.5F, x * 2, up), 4.712389F);
    EXPECT_EQ(MathUtils::angleBetweenVectors(x, {1, -1e-10F, 0}, up), 0) << "a whole turn in float";
    EXPECT_EQ(MathUtils::angleBetweenVectors(origin, y, up), 0);
    std::mt19937 random(1);
    for (int i = 0; i < 100; ++i) {
        const auto flat = some<KpVec2f>(random);  // the cosine rounds to beyond 1 at times
        EXPECT_NEAR(flat.angle(flat * 3), 0, 1e-3F);
        EXPECT_NEAR(flat.angle(flat * -3), 3.1415927F, 1e-3F);
        const auto v = some<KpVec3f>(random), reference = some<KpVec3f>(random);
        EXPECT_EQ(MathUtils::angleBetweenVectors(v, -v, reference), 3.1415927F);
    }
}

TEST(KpBox, growsFromNothing)
{
    KpBox3f box;
    box.extendBy(KpVec3f(1, 2, 3));
    box.extendBy(KpVec3f(0, 5, 3));
    EXPECT_EQ(box, KpBox3f(0, 1, 2, 5, 3, 3));
    EXPECT_TRUE(box.contains(KpVec3f(-0.5F, 5.5F, 3.5F), 0.5F));
    EXPECT_FALSE(box.contains(KpVec3f(0, 5, 3.51F), 0.5F) || box.contains(KpVec3f(0, NaN, 3), 0.5F));

    KpBox2f flat(9, 9, 8, 9);  // empty in x alone
    flat.extendBy(KpVec2f(3, 4));
    flat.extendBy(KpVec2f(2, 6));
    EXPECT_EQ(flat, KpBox2f(2, 4, 3, 6));

    KpBox3i voxels(KpVec3i(5, -1, 2), KpVec3i(3, 1, 2));
    voxels.extendBy(KpBox3i(0, 9, 0, 9, 9, 0));
    EXPECT_EQ(voxels, KpBox3i(3, 5, -1, 1, 2, 2));
    voxels.extendBy(KpBox3i(4, 9, 0, 0, -7, 1));
    EXPECT_EQ(voxels, KpBox3i(3, 9, -1, 1, -7, 2));
}

TEST(KpFuzzyCompare, measuresBySmallerOperand)
{
    EXPECT_TRUE(kpFuzzyCompare(10000.0F, 10001.0F));
    EXPECT_TRUE(kpFuzzyCompare(0.0F, 0.0F));
    EXPECT_FALSE(kpFuzzyCompare(10000.0F, 10001.5F) || kpFuzzyCompare(0.0F, 1e-30F));
    EXPECT_FALSE(kpFuzzyCompare(NaN, NaN, infinity));

    const KpVec3f far(3000, 4000, 0);
    EXPECT_TRUE(kpFuzzyCompare(origin, y * 1e-7F));
    EXPECT_TRUE(kpFuzzyCompare(far, far + z * 0.5F));
    EXPECT_FALSE(kpFuzzyCompare(origin, y * 2e-6F) || kpFuzzyCompare(far, far + (x + y) * 0.375F));
    EXPECT_TRUE(kpFuzzyCompare(origin, {3, 4, 0}, 5));
    EXPECT_FALSE(kpFuzzyCompare(origin, {3, 4, 0.01F}, 5));

    const KpPlane plane(z, 2);
    EXPECT_TRUE(kpFuzzyCompare(plane, {-z, -2.5F}, 0.5F));
    EXPECT_FALSE(kpFuzzyCompare(plane, {-z, -2.75F}, 0.5F) || kpFuzzyCompare(plane, {z, -2.0F}, 0.5F));
    EXPECT_FALSE(kpFuzzyCompare({z, 0.0F}, {-z, 0.0F}, 0.5F)) << "no distance tells that it is turned over";
}

TEST(MathUtils, answersAtItsBounds)
{
    EXPECT_TRUE(MathUtils::areParallel(x, x * -5, 1e-6F));
    EXPECT_TRUE(MathUtils::areParallel(origin, y, 1e-6F));
    EXPECT_FALSE(MathUtils::areParallel(x, x, 0) || MathUtils::areParallel(x, x * 100 + y, 0.009F));
    EXPECT_TRUE(MathUtils::areLinearlyIndependent(x, x + y, z * 1e-10F));
    EXPECT_FALSE(MathUtils::areLinearlyIndependent(x, y, x * 2 - y));
    EXPECT_TRUE(MathUtils::arePerpendicular(x * 3e-4F, x * 3e-3F)) << "lengths count";
    EXPECT_FALSE(MathUtils::arePerpendicular(x, y + x * 1.1e-6F));
    EXPECT_EQ(MathUtils::getPerpendicularVector({1, -1, 1}), KpVec3f(0, 1, 1));
    EXPECT_EQ(MathUtils::getPerpendicularVector({3, 1, -1}), KpVec3f(1, 0, 3));
}

}  // namespace
