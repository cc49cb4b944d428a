#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpProjector.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/KpSphere.h>

/// A projector onto a sphere in working space: positions on it become rotations.
///
/// A change of the sphere, of front or orientation or of the working space is taken up by the next projection. A new
/// view volume is not: a projector that is oriented to the eye has to be told by setFront() or setSphere().
class KPLIB_API KpSphereProjector : public KpProjector {
public:
    /// The turn about the sphere's center that takes `from` to `to`, two positions on it.
    virtual KpRotation getRotation(const KpVec3f& from, const KpVec3f& to) = 0;
    /// Takes up what has changed; `line`, which may be null, is the view in working space. Projections call it.
    virtual void setupPlane(const KpLine* line) = 0;
    void setWorkingSpace(const KpMat4f& workingToWorld) override;

    /// In working space; at the start of radius 1 about the origin.
    void setSphere(const KpSphere& sphere);
    const KpSphere& sphere() const { return sphere_; }
    /// Whether the half toward the viewer is meant, as at the start, or the one behind.
    void setFront(bool intersectFront);
    bool isIntersectFront() const { return intersectFront_; }
    /// Whether that half is the one toward the eye, or the one toward +z.
    void setOrientToEye(bool orientToEye);
    bool isOrientToEye() const { return orientToEye_; }

    /// Whether `point` in working space is on the half of the sphere toward the eye, its rim included.
    bool isPointInFront(const KpVec3f& point) const;
    /// project(), and the rotation from the position before: for each step of a drag, which begins with project().
    KpVec3f projectAndGetRotation(const KpVec2f& point, KpRotation& rotation);
    /// What the last projection gave; zero before the first.
    const KpVec3f& lastPoint() const { return lastPoint_; }

protected:
    explicit KpSphereProjector(bool orientToEye) : orientToEye_(orientToEye) {}
    KpSphereProjector(const KpSphere& sphere, bool orientToEye) : sphere_(sphere), orientToEye_(orientToEye) {}

    /// The eye of a perspective in working space.
    KpVec3f eye() const;
    /// The direction toward the viewer of an orthographic view in working space.
    KpVec3f towardViewer() const;

    bool intersectFront_ = true;
    KpSphere sphere_{KpVec3f(0, 0, 0), 1};
    bool orientToEye_;
    bool needSetup_ = true;
    KpVec3f lastPoint_{0, 0, 0};
};
