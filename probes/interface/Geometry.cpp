// Vectors, matrices, view volumes, projectors, shapes.
#include <kplib/geometry/KpCoordinateSystem.h>
#include <kplib/geometry/KpCutBoxPlane.h>
#include <kplib/geometry/KpLine.h>
#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/KpSphere.h>
#include <kplib/geometry/KpSphereProjector.h>
#include <kplib/geometry/KpSphereSheetProjector.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/geometry/KpViewVolume.h>
#include <kplib/geometry/MathUtils.h>
#include <kplib/geometry/shapes/Ellipse2D.h>
#include <kplib/geometry/shapes/Rectangle2D.h>

#include <gtest/gtest.h>

#include <numbers>
#include <vector>

namespace {

template <typename Matrix, int n>
void expectRowsComeBack()
{
    float rows[n][n], back[n][n];
    for (int i = 0; i < n * n; ++i)
        rows[i / n][i % n] = static_cast<float>(i);
    Matrix matrix;
    matrix = rows;
    matrix.getValue(back);
    for (int i = 0; i < n * n; ++i) {
        EXPECT_EQ(back[i / n][i % n], i);
        EXPECT_EQ(matrix[i / n][i % n], i);
    }
}

TEST(Interface, matricesAndRotations)
{
    expectRowsComeBack<KpMat3f, 3>();
    expectRowsComeBack<KpMat4f, 4>();
    float x, y, z, w;
    KpRotation(0, 0, 2, 0).getValue(x, y, z, w);
    EXPECT_EQ(std::tuple(x, y, z, w), std::tuple(0.0F, 0.0F, 1.0F, 0.0F));
    EXPECT_TRUE(MathUtils::haveSameSpaceOrientation(KpVec3f(1, 0, 0), KpVec3f(1, 9, 0)));
    EXPECT_FALSE(MathUtils::haveSameSpaceOrientation(KpVec3f(1, 0, 0), KpVec3f(-1, 9, 0)));
}

TEST(Interface, coordinateSystems)
{
    KpCoordinateSystem system(KpVec3f(1, 2, 3), {KpVec3f(1, 0, 0), KpVec3f(1, 1, 0), KpVec3f(0, 0, 1)});
    EXPECT_FALSE(system.isPerpendicular());
    system.makeIdentity();
    EXPECT_TRUE(system.isPerpendicular());
    EXPECT_EQ(system.origin(), KpVec3f(0, 0, 0));
}

TEST(Interface, viewsAndProjectors)
{
    KpViewVolume view;
    view.ortho(-2, 2, -2, 2, 1, 10);
    view.setCameraOffset(3);
    view.unsetCameraOffset();
    EXPECT_FALSE(view.isCameraOffsetSet());
    KpLine line;
    view.projectPointToLine(KpVec2f(0.75F, 0.5F), line);
    EXPECT_EQ(line.direction(), KpVec3f(0, 0, -1));
    EXPECT_EQ(line.position(), view.projectPointToLine(KpVec2f(0.75F, 0.5F)).position());

    KpSphereSheetProjector projector(false);
    projector.setViewVolume(view);
    projector.setSphere(KpSphere(KpVec3f(0, 0, 0), 2));
    EXPECT_EQ(projector.intersect(KpLine(KpVec3f(0, 0, 5), KpVec3f(0, 0, -5))), KpVec3f(0, 0, 2));
    const KpVec3f beside = projector.intersect(KpLine(KpVec3f(8, 0, 5), KpVec3f(8, 0, -5)));
    EXPECT_FLOAT_EQ(beside[2], 4.0F / (2 * 8)) << "on the sheet r^2 / 2d";
}

TEST(Interface, shapes)
{
    EXPECT_EQ(&KpSphere::emptySphere(), &KpSphere::emptySphere());
    EXPECT_EQ(KpSphere::emptySphere().radius(), -1);
    Ellipse2D ellipse(KpVec2f(0, 0), 1, 1);
    ellipse.setRadius(KpVec2f(2, 3));
    EXPECT_FLOAT_EQ(ellipse.area(), 6 * std::numbers::pi_v<float>);
    EXPECT_EQ(Rectangle2D(KpVec2f(5, 1), KpVec2f(2, 7)).size(), KpVec2f(3, 6));

    const std::vector<KpVec3f> cut =
        KpCutBoxPlane::cutPlane(KpVec3f(0, 0, 0), KpVec3f(2, 2, 2), KpPlane(KpVec3f(0, 0, 1), KpVec3f(0, 0, 1)));
    ASSERT_EQ(cut.size(), 4U);
    for (const KpVec3f& vertex : cut)
        EXPECT_EQ(vertex[2], 1);
}

}  // namespace
