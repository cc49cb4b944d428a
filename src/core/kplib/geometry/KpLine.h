#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>

#include <type_traits>

class KpBox3f;

/// A line in space: a position and a direction of length 1 and nothing else, so that the object is its own byte image.
///
/// The line has no ends: parameters along it, lengths from the position, may be negative where
/// nothing else is said. Where there is no result an operation gives false and, but for the pick
/// tests that have no outputs, NaN in all its outputs. A plain value in float arithmetic; a
/// default-made one is not initialised.
class KPLIB_API KpLine {
public:
    constexpr KpLine() = default;
    /// What setValue() makes of the two points.
    KpLine(const KpVec3f& p0, const KpVec3f& p1) { setValue(p0, p1); }

    /// From `p0` toward `p1`; all NaN if their distance is 0.
    void setValue(const KpVec3f& p0, const KpVec3f& p1);
    /// Makes `direction` of length 1 and gives its former length; one of length 0 stays, other than in setValue().
    float setPosDir(const KpVec3f& position, const KpVec3f& direction);

    /// A point of the line.
    const KpVec3f& position() const { return position_; }
    /// The direction.
    const KpVec3f& direction() const { return direction_; }

    /// The foot of the perpendicular from `point`.
    KpVec3f getClosestPoint(const KpVec3f& point) const;
    /// The points in which two lines are nearest to each other. False if they are exactly parallel.
    bool getClosestPoints(const KpLine& other, KpVec3f& onThis, KpVec3f& onOther) const;

    /// Where the line goes into and out of `box`, whose bounds are moved out by `tolerance` for the test. A line that
    /// crosses the box, between two opposite faces, in less than `tolerance` gives true at once and writes nothing: it
    /// hits without points. An empty box is missed. Kay and Kajiya, "Ray tracing complex scenes", 1986.
    bool intersect(const KpBox3f& box, KpVec3f& enter, KpVec3f& exit, float tolerance) const;

    /// Where the line goes through the triangle a, b, c: `hit`, and in `barycentric` the weights
    /// of the corners, whose sum is 1. `front` is true if a, b, c run clockwise as seen along the
    /// line; it is false on a miss. False if the triangle has no area or the line lies along it;
    /// edges belong to it. Badouel, "An efficient ray-polygon intersection", Graphics Gems, 1990.
    bool intersect(const KpVec3f& a, const KpVec3f& b, const KpVec3f& c, KpVec3f& hit, KpVec3f& barycentric,
                   bool& front) const;

    // Picks: whether something is nearer to the line than an angle in radians, seen from the position; a negative
    // `angle` is a distance of -`angle`. The comparison is strict.

    /// The box is grown by the greatest distance of a corner from the position times tan(`angle`);
    /// at angle 0 a line that crosses it still hits it, also behind the position.
    bool intersect(float angle, const KpBox3f& box) const;
    /// A point at the position or behind it is never picked.
    bool intersect(float angle, const KpVec3f& point) const;
    /// `out` is the point of the segment from `p0` to `p1` that the line is nearest to. False for a segment of length
    /// 0 and for one that is exactly parallel.
    bool intersect(float angle, const KpVec3f& p0, const KpVec3f& p1, KpVec3f& out) const;

    /// Exact; a line that holds a NaN equals none.
    friend constexpr bool operator==(const KpLine& a, const KpLine& b) = default;

private:
    KpVec3f pointAt(float t) const { return position_ + direction_ * t; }

    KpVec3f position_;
    KpVec3f direction_;
};

static_assert(sizeof(KpLine) == 24 && std::is_trivially_copyable_v<KpLine>);
