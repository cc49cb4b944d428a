#include <kplib/geometry/numerics/KpFitPlane.h>

#include <gtest/gtest.h>

#include <cmath>
#include <random>

namespace {

TEST(KpFitPlane, findsThePlaneOfNoisyPoints)
{
    std::mt19937 random(1);
    std::uniform_real_distribution<float> number(-1, 1);
    for (int trial = 0; trial < 20; ++trial) {
        KpVec3f normal(number(random), number(random), number(random));
        normal.normalize();
        const KpVec3f u = normal.cross(KpVec3f(0.3F, 0.5F, -0.7F)), v = normal.cross(u), centre(4, -5, 6);
        KpFitPlane plane;
        for (int i = 0; i < 200; ++i)
            plane.points().append(centre + u * (9 * number(random)) + v * (7 * number(random)) +
                                  normal * (0.01F * number(random)));
        plane.fit();
        EXPECT_GT(std::abs(plane.normal().dot(normal)), 0.99999F);
        EXPECT_LT(std::abs((plane.centroid() - centre).dot(normal)), 0.005F);

        float squares = 0;
        for (const KpVec3f& point : plane.points()) {
            const KpVec3f foot = plane.projection().multMatrixVec(point), d = point - foot;
            squares += d.squaredLength();
            EXPECT_LT((foot + plane.normal() * (point - plane.centroid()).dot(plane.normal()) - point).length(), 1e-4F);
        }
        EXPECT_NEAR(plane.orthogonalPlaneFit(), squares, 1e-3F);
    }
}

TEST(KpFitPlane, keepsItsAccuracyOverManyDistantPoints)
{
    std::mt19937 random(1);
    std::uniform_real_distribution<float> number(-50, 50);
    KpVec3f normal(1, 2, 3);
    normal.normalize();
    const KpVec3f u = KpVec3f(3, 0, -1) / std::sqrt(10.0F), v = normal.cross(u);
    KpFitPlane plane;
    for (int i = 0; i < 100000; ++i)
        plane.points().append(KpVec3f(1e5F, 0, 0) + u * number(random) + v * number(random));
    plane.fit();
    EXPECT_LT(plane.normal().cross(normal).length(), std::sin(0.1F * 3.14159F / 180));
}

TEST(KpFitPlane, needsThreePointsOrOne)
{
    KpFitPlane plane;
    EXPECT_EQ(plane.orthogonalPlaneFit(), 0);
    plane.points() = {KpVec3f(1, 2, 3), KpVec3f(3, 2, 3)};
    plane.fit();
    EXPECT_EQ(plane.normal(), KpVec3f(0, 0, 0));
    EXPECT_EQ(plane.projection(), KpMat4f::identity());
    EXPECT_EQ(plane.orthogonalPlaneFit(), 0);
    EXPECT_EQ(plane.centroid(), KpVec3f(2, 2, 3));
    plane.points() = {KpVec3f(1, 2, 3), KpVec3f(1, 3, 3), KpVec3f(1, 2, 4)};  // a normal along x has no basis
    EXPECT_EQ(plane.createPlane(), plane.projection());
    EXPECT_LT((plane.projection().multMatrixVec(KpVec3f(9, 9, 9)) - plane.centroid()).length(), 1e-5F);
}

}  // namespace
