#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpVec3f.h>

#include <vector>

class KpPlane;

/// Computes the polygons in which parallel planes cut an axis-aligned box. Values that depend on
/// the box and the normal are computed once. A cut then takes eight comparisons, one table look-up
/// and up to six vertices.
///
/// The vertices are in order around the polygon, 3 to 6 of them or none. The direction of rotation
/// is independent of the normal. A corner on the plane counts as above it. With a second box, each
/// vertex is also computed at the corresponding place in that box, for example in texture
/// coordinates of a volume. A plain value; any number of threads may cut at once.
class KPLIB_API KpCutBoxPlane {
public:
    /// The box from 0 to 1 on each axis, cut at a right angle to x.
    KpCutBoxPlane();
    // Each is what init() makes of the same arguments; two corners are those of a box.
    /// @{
    /// As init().
    KpCutBoxPlane(const KpBox3f& box, const KpVec3f& normal) { init(box, normal); }
    KpCutBoxPlane(const KpBox3f& box1, const KpBox3f& box2, const KpVec3f& normal) { init(box1, box2, normal); }
    KpCutBoxPlane(const KpVec3f& min, const KpVec3f& max, const KpVec3f& normal) { init(KpBox3f(min, max), normal); }
    /// @}

    /// Prepares cuts of `box` by planes with `normal`, of any length. A second box that was set
    /// before stays.
    void init(const KpBox3f& box, const KpVec3f& normal);
    /// The same, with `box2` as the second box.
    void init(const KpBox3f& box1, const KpBox3f& box2, const KpVec3f& normal);

    /// The box.
    const KpBox3f& box() const { return box_; }

    // The plane of a cut holds the points p with normal · p = distance.

    /// The vertices of the polygon.
    std::vector<KpVec3f> cutPlane(float distance) const;
    /// Writes the vertices in both boxes, each to an array of 6 elements, and returns their
    /// number. Allocates nothing. `secondVertices` may be null, and must be null if there is no
    /// second box.
    int cutPlane(float distance, KpVec3f* vertices, KpVec3f* secondVertices) const;

    // For one cut alone.

    /// @{
    /// As above, for one plane.
    static std::vector<KpVec3f> cutPlane(const KpBox3f& box, const KpPlane& plane);
    static std::vector<KpVec3f> cutPlane(const KpVec3f& min, const KpVec3f& max, const KpPlane& plane);
    static int cutPlane(const KpBox3f& box1, const KpBox3f& box2, const KpPlane& plane, KpVec3f* vertices,
                        KpVec3f* secondVertices);
    /// @}
private:
    float cornerValues_[8];  // the corners along the normal
    KpBox3f box_;
    KpVec3f corners_[8];
    KpVec3f secondCorners_[8];
};

static_assert(sizeof(KpCutBoxPlane) == 248);
