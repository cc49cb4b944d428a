#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec2f.h>

#include <vector>

/// A line in the plane, or the segment between two points: a position and a direction that keeps its length.
///
/// A plain value. An empty line has a direction of zero or NaN; operations that need a direction
/// use the position instead.
class KPLIB_API KpLine2D {
public:
    /// Empty: four zeros.
    constexpr KpLine2D() = default;
    /// From `p0` to `p1`.
    KpLine2D(const KpVec2f& p0, const KpVec2f& p1) { setValue(p0, p1); }

    /// Becomes empty.
    void makeEmpty() { *this = KpLine2D(); }
    /// From `p0` to `p1`.
    void setValue(const KpVec2f& p0, const KpVec2f& p1) { setPosDir(p0, p1 - p0); }
    /// Replaces position and direction.
    void setPosDir(const KpVec2f& position, const KpVec2f& direction)
    {
        position_ = position;
        direction_ = direction;
    }

    /// Where the segment starts.
    const KpVec2f& position() const { return position_; }
    /// From the start of the segment to its end.
    const KpVec2f& direction() const { return direction_; }
    /// Both ends of the segment.
    std::vector<KpVec2f> getCoordinates() const { return {position_, position_ + direction_}; }

    /// Whether a number is NaN or the direction is exactly zero.
    bool isEmpty() const;
    /// Whether there is a direction.
    bool isNotEmpty() const { return !isEmpty(); }

    /// Signed distance of `p` from the unbounded line, positive to the left of the direction (y
    /// upward). The distance from an empty line is never negative.
    float getDistanceTo(const KpVec2f& p) const;
    float getDistance2To(const KpVec2f& p) const;  ///< its square

    /// The point of the line, or with `clampToSegment` of the segment, nearest to `p`.
    KpVec2f getClosestPoint(const KpVec2f& p, bool clampToSegment) const;

    /// Moves the line sideways, to the left of its direction (y upward).
    void translate(float distance);

    /// Whether the lines intersect. Sets `out`, if not null, to the intersection. Parallel and
    /// empty lines never intersect. With `segmentsOnly` the point must lie in both segments, ends
    /// included.
    bool intersects(const KpLine2D& other, bool segmentsOnly, KpVec2f* out) const;
    /// As above, for lines.
    bool intersects(const KpLine2D& other, KpVec2f* out) const { return intersects(other, false, out); }
    /// As above, for segments.
    bool intersectsSegments(const KpLine2D& other, KpVec2f* out) const { return intersects(other, true, out); }

private:
    KpVec2f position_{0, 0};
    KpVec2f direction_{0, 0};
};
