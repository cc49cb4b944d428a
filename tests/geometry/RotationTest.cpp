#include "SomeVectors.h"

#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpRotation.h>

using namespace kplib::test;

namespace {

constexpr float pi = 3.1415927F, tight = 4e-6F;

KpRotation turn(std::mt19937& random)
{
    auto rotation = some<KpRotation>(random);
    rotation.normalize();
    return rotation;
}

TEST(KpRotation, turnsRowVectors)
{
    expectNear(KpRotation(z * 7, pi / 2) * x, y, tight);
    std::mt19937 random(1);
    for (int i = 0; i < 200; ++i) {
        const KpRotation a = turn(random), b = turn(random);
        auto v = some<KpVec3f>(random);
        expectNear((a * b) * v, b * (a * v), tight);
        expectNear(a.inverse() * (a * v), v, tight);
        EXPECT_TRUE((KpRotation(a) *= b).equals(a * b, tight));
        const KpVec3f turned = a.toMat3f().multVecMatrix(v);
        a.multVec(v, v);
        EXPECT_EQ(v, turned);
    }
}

TEST(KpRotation, survivesOtherForms)
{
    std::mt19937 random(2);
    KpVec3f axis;
    float angle;
    for (int i = 0; i < 400; ++i) {
        KpRotation q = turn(random);
        if (i % 4 != 3)  // nearly half turns, whose trace says little: each axis in its turn
            q = KpRotation(KpVec3f(i % 4 == 0, i % 4 == 1, i % 4 == 2) + someVector(random, 0.2F), pi - 0.01F);
        EXPECT_TRUE(KpRotation(KpMat4f(q.toMat3f())).equals(q, tight));
        EXPECT_TRUE(KpRotation(q.toMat3f()).equals(q, tight));
        q.getValue(axis, angle);
        EXPECT_NEAR(axis.length(), 1, 1e-6);
        EXPECT_TRUE(KpRotation(axis, angle).equals(q, tight));
    }
    KpMat4f larger;  // the corner of a matrix counts
    larger.setScale(4);
    larger[3][3] = 4;
    EXPECT_EQ(KpRotation(larger).norm(), 4);
    EXPECT_EQ(KpRotation(larger).inverse()[3], 0.5F);
    KpRotation quarter(z, pi / 2);
    quarter.scaleAngle(2);
    EXPECT_TRUE(quarter.equals(KpRotation(0, 0, 1, 0), tight));

    KpRotation(x, 1.9e-5F).getValue(axis, angle);
    EXPECT_EQ(std::tuple(axis, angle), std::tuple(z, 0.0F)) << "nearly no turn";
    KpRotation(x, 2.1e-5F).getValue(axis, angle);
    EXPECT_EQ(axis, x);
    EXPECT_TRUE(std::isnan(KpRotation(0, 0, 0, 0)[0]));
    KpRotation(1, -1, -1, 1).getValue(axis[0], axis[1], axis[2], angle);
    EXPECT_EQ(std::tuple(axis, angle), std::tuple(KpVec3f(0.5F, -0.5F, -0.5F), 0.5F));

    int beyond = 0;  // products of small turns with a w above 1
    for (float a = 1e-5F; a < 3e-3F; a += 1e-5F) {
        for (float b = 1e-5F; b < 3e-3F; b += 1e-5F) {
            const KpRotation q =
                KpRotation(x, a) * KpRotation(x, b) * KpRotation(x, -0.9F * a) * KpRotation(x, -0.8F * b);
            q.getValue(axis, angle);
            beyond += q[3] > 1 && angle == 0 && axis == x;
            ASSERT_FALSE(std::isnan(angle)) << a << ' ' << b;
        }
    }
    EXPECT_GT(beyond, 0);
}

TEST(KpRotation, comparesQuaternionsAndRotations)
{
    const KpRotation q(1, 2, 3, 4), negative(-1, -2, -3, -4);
    EXPECT_FALSE(q == negative || q.equals(q, 0) || q.equals(negative, 0));
    EXPECT_TRUE(q.equals(negative, 1e-30F));
    EXPECT_FALSE(KpRotation(1, 0, 0, 1).equals({1, 0, 0, -1}, 0.5F)) << "each half fits one of the two";
}

TEST(KpRotation, takesOneDirectionToAnother)
{
    EXPECT_EQ(KpRotation(x, -x), KpRotation(0, 0, 1, 0));
    EXPECT_EQ(KpRotation(y, -y), KpRotation(0, 0, -1, 0));
    EXPECT_FLOAT_EQ(KpRotation(origin, x)[3], std::sqrt(0.5F));
    std::mt19937 random(3);
    for (int i = 0; i < 200; ++i) {
        auto from = some<KpVec3f>(random), to = some<KpVec3f>(random);
        KpVec3f second = from.cross(some<KpVec3f>(random)), target = to.cross(some<KpVec3f>(random));
        const KpVec3f turned = KpRotation(from, to) * from / from.length();
        for (KpVec3f* vector : {&from, &to, &second, &target})
            vector->normalize();
        expectNear(turned, to, 1e-5F);
        const KpRotation both(from, second, to, target);
        expectNear(both * from, to, 1e-5F);
        expectNear(both * second, target, 1e-3F);
    }
}

TEST(KpRotation, slerpGoesTheShorterWayAtSteadySpeed)
{
    const auto angleBetween = [](const KpRotation& a, const KpRotation& b) {
        return 2 * std::acos(std::min(1.0F, std::abs((a.inverse() * b)[3])));
    };
    std::mt19937 random(4);
    for (int i = 0; i < 200; ++i) {
        const KpRotation a = turn(random), b = turn(random);
        EXPECT_EQ(KpRotation::slerp(a, b, 0), a);
        EXPECT_TRUE(KpRotation::slerp(a, b, 1).equals(b, 1e-30F));
        EXPECT_NEAR(angleBetween(a, KpRotation::slerp(a, b, 0.25F)), angleBetween(a, b) / 4, 5e-3F);
    }
    for (const float angle : {0.001F, 0.1F})
        EXPECT_TRUE(KpRotation::slerp({z, 0.0F}, {z, angle}, 0.25F).equals({z, angle / 4}, 1e-6F));
}

}  // namespace
