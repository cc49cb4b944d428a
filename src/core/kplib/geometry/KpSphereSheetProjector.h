#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/KpSphereProjector.h>

/// The trackball of a viewer: a sphere that turns, at 45 degrees, into a hyperbolic sheet, so that dragging on beyond
/// the silhouette keeps turning smoothly. Chen, Mountford and Sellen, "A study in interactive 3-D rotation using 2-D
/// control devices", 1988; Henriksen, Sporring and Hornbæk, "Virtual trackballs revisited", 2004.
class KPLIB_API KpSphereSheetProjector : public KpSphereProjector {
public:
    /// @{
    /// As the base class.
    explicit KpSphereSheetProjector(bool orientToEye = true) : KpSphereProjector(orientToEye) {}
    explicit KpSphereSheetProjector(const KpSphere& sphere, bool orientToEye = true) :
        KpSphereProjector(sphere, orientToEye)
    {
    }
    /// @}

    KpVec3f project(const KpVec2f& point) override;
    KpVec3f intersect(const KpLine& line) override;
    KpSphereSheetProjector* copy() const override;
    /// The identity for points that are nearly equal or that are farther apart than the diameter
    /// of the sphere.
    KpRotation getRotation(const KpVec3f& from, const KpVec3f& to) override;
    void setupPlane(const KpLine* line) override;

    // Results of setupPlane(): the eye of a perspective, and the plane through the centre on which
    // sheet and sphere stand, with its direction toward the selected half.
    /// The eye of a perspective.
    const KpVec3f& planeEye() const { return planeEye_; }
    /// A point of the plane.
    const KpVec3f& planePoint() const { return planePoint_; }
    /// Its normal.
    const KpVec3f& planeDir() const { return planeDir_; }
    /// Its distance from the centre, always 0.
    float planeDist() const { return planeDist_; }
    /// The plane.
    const KpPlane& tolPlane() const { return tolPlane_; }

private:
    bool meetsSphere(const KpLine& line, KpVec3f& onSphere, KpVec3f& onPlane) const;
    KpVec3f onSheet(const KpVec3f& onPlane, const KpVec3f& direction) const;
    KpVec3f sheetDirection(const KpVec3f& onPlane) const;

    KpVec3f planeEye_{0, 0, 0}, planePoint_{0, 0, 0}, planeDir_{0, 0, 1};
    float planeDist_ = 0;  // the plane goes through the center: always 0
    KpPlane tolPlane_ = KpPlane(planeDir_, planePoint_);
};
