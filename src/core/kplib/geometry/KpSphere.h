#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>

#include <type_traits>

class KpLine;

/// A sphere: a centre and a radius. A tangent line hits it. For lines a negative radius counts as
/// its magnitude. A line or point that is NaN hits, with NaN as the result. A plain value in float
/// arithmetic. A default-constructed sphere is not initialised.
class KPLIB_API KpSphere {
public:
    constexpr KpSphere() = default;
    /// Of that centre and radius.
    constexpr KpSphere(const KpVec3f& center, float radius) : center_(center), radius_(radius) {}

    /// A sphere about the origin with the radius -1, always the same object. The first call must
    /// not run at the same time as another.
    static const KpSphere& emptySphere();

    /// The centre.
    const KpVec3f& center() const { return center_; }
    /// The radius.
    float radius() const { return radius_; }
    /// Moves the centre.
    void setCenter(const KpVec3f& center) { center_ = center; }
    /// Replaces the radius.
    void setRadius(float radius) { radius_ = radius; }

    /// Sets `out` to the first intersection at a parameter of 0 or more along the line; if the
    /// position is inside, that is where the line leaves the sphere. Returns false and leaves
    /// `out` unchanged if there is none.
    bool intersect(const KpLine& line, KpVec3f& out) const;
    /// Sets both intersections with the unbounded line. Returns false and sets both to NaN if it
    /// misses.
    bool intersect(const KpLine& line, KpVec3f& enter, KpVec3f& exit) const;
    /// Sets the ends of the part of the segment from `p0` to `p1` that is in the sphere. Returns
    /// false and sets both to NaN if the unbounded line misses. If only the segment misses,
    /// returns true and sets both to the same end of the segment.
    bool intersect(const KpVec3f& p0, const KpVec3f& p1, KpVec3f& enter, KpVec3f& exit) const;

    /// Exact; a sphere that holds a NaN equals none.
    friend constexpr bool operator==(const KpSphere& a, const KpSphere& b) = default;

private:
    KpVec3f center_;
    float radius_;
};

static_assert(sizeof(KpSphere) == 16 && std::is_trivially_copyable_v<KpSphere>);
