#include "SomeVectors.h"

#include <kplib/geometry/KpSphereSheetProjector.h>

#include <memory>

using namespace kplib::test;

namespace {

// Looks down on the origin, which is in the middle, from +z; the screen spans -4 to 4 there. In perspective from 8
// away.
KpSphereSheetProjector projector(bool isBox, bool orientToEye, const KpSphere& sphere = {origin, 1})
{
    KpViewVolume volume;
    isBox ? volume.ortho(-4, 4, -4, 4, 1, 20) : volume.perspective(2 * std::atan(0.5F), 1, 1, 20);
    volume.translateCamera(z * 8);
    KpSphereSheetProjector result(sphere, orientToEye);
    result.setViewVolume(volume);
    return result;
}

KpVec2f screen(float across, float up)
{
    return {(across + 4) / 8, (up + 4) / 8};
}

}  // namespace

TEST(KpSphereSheetProjector, isASphereThatTurnsIntoASheet)
{
    for (const int kind : {0, 1, 2, 3}) {
        auto p = projector(true, kind & 1);
        p.setFront(kind & 2);
        for (float d = 0; d < 4; d += 0.005F) {  // across the seam too, where both formulas agree
            const float height = d * d < 0.5F ? std::sqrt(1 - d * d) : 0.5F / d;
            expectNear(p.project(screen(d, 0)), KpVec3f(d, 0, kind & 2 ? height : -height), 1e-4F);
        }
    }
    // The line misses the sphere and meets the plane at 3: from there toward the eye or along z.
    const KpVec3f foot(0, 3, 0), toEye = (z * 8 - foot) / std::sqrt(73.0F);
    expectNear(projector(false, true).project(screen(0, 3)), foot + toEye * (0.5F / 3), 1e-4F);
    expectNear(projector(false, false).project(screen(0, 3)), foot + z * (0.5F / 3), 1e-4F);
    // This one hits the sphere beyond the seam, at (0.8, 0, 0.6): from below there.
    const KpVec3f below(0.8F, 0, 0), up = (z * 8 - below) / std::sqrt(64.64F);
    expectNear(projector(false, true).project(screen(6.4F / 7.4F, 0)), below + up * 0.625F, 1e-4F);
}

TEST(KpSphereSheetProjector, turnsFromPointToPoint)
{
    std::mt19937 random(66);
    const KpVec3f center(1, -2, 3);
    auto p = projector(true, false, KpSphere(center, 2)), drag = projector(true, true);
    p.setupPlane(nullptr);
    for (int round = 0; round < 200; ++round) {
        KpVec3f a = someVector(random, 2), b = someVector(random, 2);
        a.normalize();
        b.normalize();
        expectNear(p.getRotation(center + a * 2, center + b * 2).multVec(a), b);
    }
    for (const float distance : {0.0F, 4.01F})
        EXPECT_EQ(p.getRotation(center + x * 2, center + x * (2 - distance)), KpRotation::identity());
    KpRotation step;
    const KpVec3f before = drag.project(screen(0.1F, 0));
    const KpVec3f after = drag.projectAndGetRotation(screen(0.3F, 0.4F), step);
    expectNear(step.multVec(before), after);
}

TEST(KpSphereSheetProjector, worksInItsOwnSpace)
{
    KpMat4f place;
    place.setTransform(KpVec3f(1, 2, 0), KpRotation(z, 0.5F), KpVec3f(2, 2, 2), KpRotation::identity());
    for (const bool isBox : {true, false}) {
        auto inWorld = projector(isBox, true, KpSphere(KpVec3f(1, 2, 0), 2)), inSpace = projector(isBox, true);
        inSpace.project(screen(0, 0));
        inSpace.setWorkingSpace(place);
        for (float d = -3; d < 3; d += 0.25F) {
            const KpVec3f point = inSpace.project(screen(d, 1)), world = inWorld.project(screen(d, 1));
            expectNear(place.multVecMatrix(point), world);
            EXPECT_TRUE(inSpace.isPointInFront(point));
            EXPECT_FALSE(inSpace.isPointInFront(-point));
        }
    }
}

TEST(KpSphereSheetProjector, takesUpChangesWithItsNextProjection)
{
    auto p = projector(false, true);
    p.project(screen(0, 0));
    KpViewVolume fromX = p.viewVolume();
    fromX.transform(KpMat4f(KpRotation(y, 1.5707964F).toMat3f()));
    p.setViewVolume(fromX);
    p.setOrientToEye(true);
    p.project(screen(0, 0));
    expectNear(p.planeDir(), z);  // neither a camera nor the same orientation is a change
    p.setFront(true);
    const std::unique_ptr<KpProjector> copy(p.copy());
    expectNear(copy->project(screen(0, 0)), x);
}
