#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpVec3f.h>

#include <vector>

class KpPlane;

/// The polygons in which parallel planes cut an axis-aligned box. What depends on the box and the normal is computed
/// once; a cut then costs eight comparisons, a look into a table and up to six vertices.
///
/// Vertices come in order around the polygon, 3 to 6 of them or none; which way round is not tied to the normal. A
/// corner in the plane counts as above it. With a second box each vertex is also given at the same place in that one,
/// such as in texture coordinates of a volume. A plain value for the stack; any number of threads may cut at once.
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

    /// Prepares cuts of `box` by planes with `normal`, of any length. A second box stays as it was: unset, if there
    /// hasn't been any.
    void init(const KpBox3f& box, const KpVec3f& normal);
    /// The same, with `box2` as the second box.
    void init(const KpBox3f& box1, const KpBox3f& box2, const KpVec3f& normal);

    /// The box.
    const KpBox3f& box() const { return box_; }

    // The plane of a cut holds the points p with normal · p = distance.

    /// The vertices of the polygon.
    std::vector<KpVec3f> cutPlane(float distance) const;
    /// Writes the vertices in both boxes, each to an array with 6 places, and gives their number; allocates nothing.
    /// `secondVertices` may be null, and has to be where there is no second box.
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
