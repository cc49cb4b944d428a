#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpProjector.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/KpSphere.h>

/// A projector onto a sphere in working space. Pairs of positions on the sphere become rotations.
///
/// The next projection takes account of a change of the sphere, of front or orientation or of the
/// working space, but not of a new view volume: for a projector that is oriented to the eye call
/// setFront() or setSphere() after that.
class KPLIB_API KpSphereProjector : public KpProjector {
public:
    /// The rotation about the centre of the sphere that maps `from` to `to`, two positions on it.
    virtual KpRotation getRotation(const KpVec3f& from, const KpVec3f& to) = 0;
    /// Applies all changes since the last call. `line`, which may be null, is the line of sight in
    /// working space. Projections call this function.
    virtual void setupPlane(const KpLine* line) = 0;
    void setWorkingSpace(const KpMat4f& workingToWorld) override;

    /// In working space; at the start of radius 1 about the origin.
    void setSphere(const KpSphere& sphere);
    /// The sphere in working space.
    const KpSphere& sphere() const { return sphere_; }
    /// Selects the half of the sphere that faces the viewer, the default, or the opposite one.
    void setFront(bool intersectFront);
    /// See setFront().
    bool isIntersectFront() const { return intersectFront_; }
    /// Sets whether the half of setFront() faces the eye or +z.
    void setOrientToEye(bool orientToEye);
    /// See setOrientToEye().
    bool isOrientToEye() const { return orientToEye_; }

    /// Whether `point` in working space is on the half of the sphere toward the eye, its rim included.
    bool isPointInFront(const KpVec3f& point) const;
    /// Calls project() and computes the rotation from the previous position. For each step of a
    /// drag, whose first position is passed to project().
    KpVec3f projectAndGetRotation(const KpVec2f& point, KpRotation& rotation);
    /// The result of the last projection, zero before the first one.
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
