#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/KpSphereProjector.h>

/// The trackball of a viewer: a sphere that turns, at 45 degrees, into a hyperbolic sheet, so that dragging on beyond
/// the silhouette keeps turning smoothly. Chen, Mountford and Sellen, "A study in interactive 3-D rotation using 2-D
/// control devices", 1988; Henriksen, Sporring and Hornbæk, "Virtual trackballs revisited", 2004.
class KPLIB_API KpSphereSheetProjector : public KpSphereProjector {
public:
    explicit KpSphereSheetProjector(bool orientToEye = true) : KpSphereProjector(orientToEye) {}
    explicit KpSphereSheetProjector(const KpSphere& sphere, bool orientToEye = true) :
        KpSphereProjector(sphere, orientToEye)
    {
    }

    KpVec3f project(const KpVec2f& point) override;
    KpVec3f intersect(const KpLine& line) override;
    KpSphereSheetProjector* copy() const override;
    /// The identity for points that are nearly equal or further apart than the sphere is wide.
    KpRotation getRotation(const KpVec3f& from, const KpVec3f& to) override;
    void setupPlane(const KpLine* line) override;

    // What setupPlane() has made: the eye of a perspective, the plane through the center that sheet and sphere stand on
    // and its direction toward the half that is meant.
    const KpVec3f& planeEye() const { return planeEye_; }
    const KpVec3f& planePoint() const { return planePoint_; }
    const KpVec3f& planeDir() const { return planeDir_; }
    float planeDist() const { return planeDist_; }
    const KpPlane& tolPlane() const { return tolPlane_; }

private:
    bool meetsSphere(const KpLine& line, KpVec3f& onSphere, KpVec3f& onPlane) const;
    KpVec3f onSheet(const KpVec3f& onPlane, const KpVec3f& direction) const;
    KpVec3f sheetDirection(const KpVec3f& onPlane) const;

    KpVec3f planeEye_{0, 0, 0}, planePoint_{0, 0, 0}, planeDir_{0, 0, 1};
    float planeDist_ = 0;  // the plane goes through the center: always 0
    KpPlane tolPlane_ = KpPlane(planeDir_, planePoint_);
};
