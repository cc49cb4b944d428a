#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3d.h>

#include <span>

/// KpCutBoxPlane in double precision: the polygons in which parallel planes cut an axis-aligned box.
///
/// A box is given as xmin, xmax, ymin, ymax, zmin, zmax, in an array of six doubles, or as two corners.
class KPLIB_API KpCutBoxPlaneDouble {
public:
    /// xmin, xmax, ymin, ymax, zmin, zmax.
    using Box = std::span<const double, 6>;

    /// The box from 0 to 1 on each axis, cut at a right angle to x.
    KpCutBoxPlaneDouble();
    // Each is what init() makes of the same arguments; two corners are those of a box.
    /// @{
    /// As init().
    KpCutBoxPlaneDouble(Box box, const KpVec3d& normal) { init(box, normal); }
    KpCutBoxPlaneDouble(Box box1, Box box2, const KpVec3d& normal) { init(box1, box2, normal); }
    KpCutBoxPlaneDouble(const KpVec3d& min, const KpVec3d& max, const KpVec3d& normal);
    /// @}

    /// Prepares cuts of `box` by planes with `normal`, of any length. A second box that was set
    /// before stays.
    void init(Box box, const KpVec3d& normal);
    /// The same, with `box2` as the second box.
    void init(Box box1, Box box2, const KpVec3d& normal);

    /// The normal as it was given.
    const KpVec3d& normal() const { return normal_; }
    /// The box.
    Box box() const { return box_; }

    /// Writes the vertices of the cut by the plane normal · p = distance to an array of 6
    /// elements, in order around the polygon, and returns their number. Allocates nothing.
    int cutPlane(double distance, KpVec3d* vertices) const { return cutPlane(distance, vertices, nullptr); }
    /// The same in both boxes. `secondVertices` may be null, and must be null if there is no
    /// second box.
    int cutPlane(double distance, KpVec3d* vertices, KpVec3d* secondVertices) const;

private:
    double cornerValues_[8];  // the corners along the normal
    KpVec3d normal_;
    double box_[6];
    KpVec3d corners_[8];
    KpVec3d secondCorners_[8];
};

static_assert(sizeof(KpCutBoxPlaneDouble) == 520);
