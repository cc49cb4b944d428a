#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>

#include <type_traits>

class KpLine;

/// A sphere: a center and a radius. A tangent line hits it; a negative radius meets lines as its
/// magnitude does. Lines and points that are NaN hit, in NaN. A plain value in float arithmetic; a
/// default-made one is not initialised.
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

    /// The first hit at or in front of the line's position, from inside the way out. False, with `out` as it was, if
    /// there is none.
    bool intersect(const KpLine& line, KpVec3f& out) const;
    /// Both hits of the unbounded line. False, with NaN in both, if it misses.
    bool intersect(const KpLine& line, KpVec3f& enter, KpVec3f& exit) const;
    /// The ends of the part in the sphere of the segment from `p0` to `p1`. False, with NaN in both, if the unbounded
    /// line misses. If only the segment misses it is true, and both are the same end of the segment.
    bool intersect(const KpVec3f& p0, const KpVec3f& p1, KpVec3f& enter, KpVec3f& exit) const;

    /// Exact; a sphere that holds a NaN equals none.
    friend constexpr bool operator==(const KpSphere& a, const KpSphere& b) = default;

private:
    KpVec3f center_;
    float radius_;
};

static_assert(sizeof(KpSphere) == 16 && std::is_trivially_copyable_v<KpSphere>);
