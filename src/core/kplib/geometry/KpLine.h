#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>

#include <type_traits>

class KpBox3f;

/// A line in space: a position and a direction of length 1 and nothing else, so that the object is its own byte image.
///
/// The line is unbounded: parameters along it are lengths from the position and may be negative
/// unless stated otherwise. An operation without a result returns false and sets all its outputs
/// to NaN; pick tests without outputs only return false. A plain value in float arithmetic. A
/// default-constructed line is not initialised.
class KPLIB_API KpLine {
public:
    constexpr KpLine() = default;
    /// As setValue().
    KpLine(const KpVec3f& p0, const KpVec3f& p1) { setValue(p0, p1); }

    /// From `p0` toward `p1`; all NaN if their distance is 0.
    void setValue(const KpVec3f& p0, const KpVec3f& p1);
    /// Sets position and direction, normalises the direction, and returns its former length. A
    /// direction of length 0 is kept, unlike in setValue().
    float setPosDir(const KpVec3f& position, const KpVec3f& direction);

    /// A point of the line.
    const KpVec3f& position() const { return position_; }
    /// The direction.
    const KpVec3f& direction() const { return direction_; }

    /// The foot of the perpendicular from `point`.
    KpVec3f getClosestPoint(const KpVec3f& point) const;
    /// Sets the points at which the two lines are nearest to each other. Returns false if they are
    /// exactly parallel.
    bool getClosestPoints(const KpLine& other, KpVec3f& onThis, KpVec3f& onOther) const;

    /// Sets the points at which the line enters and leaves `box`, whose bounds are moved outward
    /// by `tolerance` for the test. If the line crosses the box between two opposite faces within
    /// less than `tolerance`, returns true at once and writes nothing. An empty box is missed. Kay
    /// and Kajiya, "Ray tracing complex scenes", 1986.
    bool intersect(const KpBox3f& box, KpVec3f& enter, KpVec3f& exit, float tolerance) const;

    /// Intersects the line with the triangle a, b, c. Sets `hit` to the point and `barycentric` to
    /// the weights of the corners, whose sum is 1. `front` is true if a, b, c run clockwise as
    /// seen along the line, and false on a miss. Returns false if the triangle has no area or the
    /// line lies in its plane. Edges belong to the triangle. Badouel, "An efficient ray-polygon
    /// intersection", Graphics Gems, 1990.
    bool intersect(const KpVec3f& a, const KpVec3f& b, const KpVec3f& c, KpVec3f& hit, KpVec3f& barycentric,
                   bool& front) const;

    // Picks: whether an object is nearer to the line than an angle in radians, as seen from the
    // position. A negative `angle` is a distance of -`angle`. The comparison is strict.

    /// Grows the box by the greatest distance of a corner from the position times tan(`angle`). At
    /// angle 0 a line that crosses the box hits it, also at negative parameters.
    bool intersect(float angle, const KpBox3f& box) const;
    /// A point at the position, or at a negative parameter, is never picked.
    bool intersect(float angle, const KpVec3f& point) const;
    /// Sets `out` to the point of the segment from `p0` to `p1` that is nearest to the line.
    /// Returns false for a segment of length 0 and for one that is exactly parallel.
    bool intersect(float angle, const KpVec3f& p0, const KpVec3f& p1, KpVec3f& out) const;

    /// Exact; a line that holds a NaN equals none.
    friend constexpr bool operator==(const KpLine& a, const KpLine& b) = default;

private:
    KpVec3f pointAt(float t) const { return position_ + direction_ * t; }

    KpVec3f position_;
    KpVec3f direction_;
};

static_assert(sizeof(KpLine) == 24 && std::is_trivially_copyable_v<KpLine>);
