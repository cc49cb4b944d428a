#include "Random.h"

#include <kplib/geometry/KpRotation.h>

#include <gtest/gtest.h>

using namespace kplib::test;

namespace {

constexpr float pi = 3.1415927F, half = 0.70710678F;
const KpVec3f x(1, 0, 0), y(0, 1, 0), z(0, 0, 1), zero(0, 0, 0);

KpRotation turn(Random& random)
{
    const KpVec3f v = random.vector();
    return {v.x(), v.y(), v.z(), random.number()};
}

KpMat4f matrixOf(const KpRotation& rotation)
{
    KpMat4f matrix;
    matrix.setRotate(rotation);
    return matrix;
}

bool isNear(const KpVec3f& a, const KpVec3f& b, float tolerance = 2e-6F)
{
    return (a - b).length() <= tolerance;
}

TEST(KpRotation, turnsRowVectors)
{
    EXPECT_TRUE(isNear(KpRotation(z, pi / 2) * x, y));
    EXPECT_TRUE(isNear(KpRotation(x * 7, pi / 2) * y, z));
    EXPECT_TRUE(isNear(KpRotation(y, pi / 2) * z, x));
    EXPECT_EQ(KpRotation::identity().toMat3f(), KpMat3f::identity());
    Random random(1);
    for (int i = 0; i < 200; ++i) {
        const KpRotation a = turn(random), b = turn(random);
        KpVec3f v = random.vector();
        const KpVec3f turned = matrixOf(a).multVecMatrix(v);
        EXPECT_TRUE(isNear((a * b) * v, b * (a * v)));
        EXPECT_TRUE(matrixOf(a * b).equals(matrixOf(a) * matrixOf(b), 2e-6F));
        KpRotation product = a;
        product *= b;
        EXPECT_TRUE(product.equals(a * b, 1e-6F));
        a.multVec(v, v);
        EXPECT_EQ(v, turned);
        EXPECT_TRUE(isNear(a.inverse() * (a * v), v));
    }
}

TEST(KpRotation, survivesOtherForms)
{
    Random random(2);
    for (int i = 0; i < 400; ++i) {
        KpRotation q = turn(random);
        if (i % 4 != 3)  // nearly half turns, whose trace says little: each axis in its turn
            q = KpRotation(KpVec3f(i % 4 == 0, i % 4 == 1, i % 4 == 2) + random.vector() * 0.1F, pi - 0.01F);
        EXPECT_TRUE(KpRotation(matrixOf(q)).equals(q, 2e-6F));
        EXPECT_TRUE(KpRotation(q.toMat3f()).equals(q, 2e-6F));
        KpVec3f axis;
        float angle;
        q.getValue(axis, angle);
        EXPECT_NEAR(axis.length(), 1, 1e-6);
        EXPECT_TRUE(KpRotation(axis, angle).equals(q, 2e-6F));
    }
    KpMat4f larger;  // the corner of a matrix counts
    larger.setScale(4);
    larger[3][3] = 4;
    const KpRotation twice(larger);
    EXPECT_EQ(twice[3], 2);
    EXPECT_EQ(twice.norm(), 4);
    EXPECT_EQ(twice.inverse()[3], 0.5F);
    KpRotation quarter(z, pi / 2);
    quarter.scaleAngle(2);
    EXPECT_TRUE(quarter.equals(KpRotation(0, 0, 1, 0), 1e-6F));
}

TEST(KpRotation, knowsNearlyNoTurn)
{
    KpVec3f axis;
    float angle;
    KpRotation(x, 1.9e-5F).getValue(axis, angle);
    EXPECT_EQ(axis, z);
    EXPECT_EQ(angle, 0);
    KpRotation(x, 2.1e-5F).getValue(axis, angle);
    EXPECT_EQ(axis, x);
    EXPECT_EQ(KpRotation(zero, 0.0F), KpRotation::identity());
    EXPECT_TRUE(std::isnan(KpRotation(0, 0, 0, 0)[0]));
}

TEST(KpRotation, comparesQuaternionsAndRotations)
{
    const KpRotation q(1, 2, 3, 4), negative(-1, -2, -3, -4);
    EXPECT_FALSE(q == negative);
    EXPECT_TRUE(q.equals(negative, 1e-30F));
    EXPECT_FALSE(q.equals(q, 0));
    EXPECT_FALSE(KpRotation(1, 0, 0, 1).equals(KpRotation(1, 0, 0, -1), 0.5F));  // each half fits one of the two
}

TEST(KpRotation, takesOneDirectionToAnother)
{
    EXPECT_EQ(KpRotation(x * 3, x * 5), KpRotation::identity());
    EXPECT_EQ(KpRotation(x, -x)[3], 0);
    EXPECT_EQ(KpRotation(x, -x)[0], 0);
    EXPECT_EQ(KpRotation(y, -y), KpRotation(0, 0, -1, 0));
    EXPECT_TRUE(KpRotation(zero, x) == KpRotation(zero, zero));
    EXPECT_FLOAT_EQ(KpRotation(zero, x)[3], half);
    Random random(3);
    for (int i = 0; i < 200; ++i) {
        KpVec3f from = random.vector(), to = random.vector(), second = random.vector(), target = random.vector();
        const KpVec3f turned = KpRotation(from, to) * from;
        EXPECT_TRUE(isNear(turned / from.length(), to / to.length(), 1e-5F)) << from << to;
        from.normalize();
        to.normalize();
        second = from.cross(second);
        target = to.cross(target);
        second.normalize();
        target.normalize();
        const KpRotation both(from, second, to, target);
        EXPECT_TRUE(isNear(both * from, to, 1e-5F));
        EXPECT_TRUE(isNear(both * second, target, 1e-3F)) << from << second << to << target;
    }
}

TEST(KpRotation, slerpGoesTheShorterWayAtSteadySpeed)
{
    Random random(4);
    for (int i = 0; i < 200; ++i) {
        const KpRotation a = turn(random), b = turn(random);
        EXPECT_EQ(KpRotation::slerp(a, b, 0), a);
        EXPECT_TRUE(KpRotation::slerp(a, b, 1).equals(b, 1e-30F));
        KpVec3f axis;
        float whole, part;
        (a.inverse() * b).getValue(axis, whole);
        whole = std::min(whole, 2 * pi - whole);
        (a.inverse() * KpRotation::slerp(a, b, 0.25F)).getValue(axis, part);
        EXPECT_NEAR(std::min(part, 2 * pi - part), whole / 4, 5e-3F);
    }
    for (const float angle : {0.001F, 0.1F})
        EXPECT_TRUE(KpRotation::slerp(KpRotation(z, 0), KpRotation(z, angle), 0.25F).equals({z, angle / 4}, 1e-6F));
}

}  // namespace
