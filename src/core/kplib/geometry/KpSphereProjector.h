#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpProjector.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/KpSphere.h>

/// A projector onto a sphere in working space: positions on it become rotations.
///
/// A change of the sphere, of front or orientation or of the working space is taken up by the next
/// projection. A new view volume is not: for a projector that is oriented to the eye call
/// setFront() or setSphere() afterwards.
class KPLIB_API KpSphereProjector : public KpProjector {
public:
    /// The turn about the sphere's center that takes `from` to `to`, two positions on it.
    virtual KpRotation getRotation(const KpVec3f& from, const KpVec3f& to) = 0;
    /// Applies all changes since the last call; `line`, which may be null, is the view in working
    /// space. Projections call it.
    virtual void setupPlane(const KpLine* line) = 0;
    void setWorkingSpace(const KpMat4f& workingToWorld) override;

    /// In working space; at the start of radius 1 about the origin.
    void setSphere(const KpSphere& sphere);
    /// The sphere in working space.
    const KpSphere& sphere() const { return sphere_; }
    /// Selects the half toward the viewer, the default, or the one behind it.
    void setFront(bool intersectFront);
    /// See setFront().
    bool isIntersectFront() const { return intersectFront_; }
    /// Whether that half is the one toward the eye, or the one toward +z.
    void setOrientToEye(bool orientToEye);
    /// See setOrientToEye().
    bool isOrientToEye() const { return orientToEye_; }

    /// Whether `point` in working space is on the half of the sphere toward the eye, its rim included.
    bool isPointInFront(const KpVec3f& point) const;
    /// project(), and the rotation from the position before: for each step of a drag, which begins with project().
    KpVec3f projectAndGetRotation(const KpVec2f& point, KpRotation& rotation);
    /// What the last projection gave; zero before the first.
    const KpVec3f& lastPoint() const { return lastPoint_; }

protected:
    /// @{
    /// A projector onto that sphere, of radius 1 about the origin if none is given.
    explicit KpSphereProjector(bool orientToEye) : orientToEye_(orientToEye) {}
    KpSphereProjector(const KpSphere& sphere, bool orientToEye) : sphere_(sphere), orientToEye_(orientToEye) {}
    /// @}

    /// The eye of a perspective in working space.
    KpVec3f eye() const;
    /// The direction toward the viewer of an orthographic view in working space.
    KpVec3f towardViewer() const;

    bool intersectFront_ = true;            ///< see setFront()
    KpSphere sphere_{KpVec3f(0, 0, 0), 1};  ///< in working space
    bool orientToEye_;                      ///< see setOrientToEye()
    bool needSetup_ = true;                 ///< whether setupPlane() has to run
    KpVec3f lastPoint_{0, 0, 0};            ///< see lastPoint()
};
