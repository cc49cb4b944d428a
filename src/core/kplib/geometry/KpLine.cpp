#include <kplib/geometry/KpLine.h>

#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/detail/NoResult.h>

#include <algorithm>
#include <cmath>

using kplib::detail::nanVector;

namespace {

// Whether a gap between line and object that lies `along` from the position is picked.
bool isPicked(float angle, float gap, float along)
{
    return angle < 0 ? -angle > gap : angle > gap / along;
}

float greatestDistance(const KpVec3f& point, const KpBox3f& box)
{
    float greatest = 0;
    for (int i = 0; i < 8; ++i)
        greatest = std::max(greatest, (box.corner(i) - point).length());
    return greatest;
}

KpBox3f grown(const KpBox3f& box, float radius)
{
    const KpVec3f margin(radius, radius, radius);
    return {box.min() - margin, box.max() + margin};
}

}  // namespace

void KpLine::setValue(const KpVec3f& p0, const KpVec3f& p1)
{
    if (setPosDir(p0, p1 - p0) == 0)
        setPosDir(nanVector, nanVector);
}

float KpLine::setPosDir(const KpVec3f& position, const KpVec3f& direction)
{
    KpVec3f unit = direction;  // may be this line's position
    const float length = unit.normalize();
    position_ = position;
    direction_ = unit;
    return length;
}

KpVec3f KpLine::getClosestPoint(const KpVec3f& point) const
{
    return pointAt((point - position_).dot(direction_));
}

bool KpLine::getClosestPoints(const KpLine& other, KpVec3f& onThis, KpVec3f& onOther) const
{
    const KpVec3f& d1 = direction_;
    const KpVec3f& d2 = other.direction_;
    const float e = d1.dot(d2), f = d1.dot(d1), g = d2.dot(d2);
    const float determinant = e * e - f * g;
    if (determinant == 0) {
        onThis = onOther = nanVector;
        return false;
    }
    const float u = position_.dot(d1) - other.position_.dot(d1);
    const float v = position_.dot(d2) - other.position_.dot(d2);
    onThis = pointAt((g * u - e * v) / determinant);
    onOther = other.pointAt((e * u - f * v) / determinant);
    return true;
}

bool KpLine::intersect(float angle, const KpBox3f& box) const
{
    if (box.isEmpty())
        return false;
    const auto slope = static_cast<float>(std::tan(static_cast<double>(angle)));
    const float radius = angle < 0 ? -angle : greatestDistance(position_, box) * slope;
    KpVec3f enter, exit;
    return intersect(grown(box, radius), enter, exit, 1e-6F);
}

bool KpLine::intersect(float angle, const KpVec3f& point) const
{
    const KpVec3f r = point - position_;
    const float t = r.dot(direction_);
    if (!(t > 0))
        return false;
    // For a point on the line, rounding may give a value below 0.
    const float squaredGap = std::max(r.dot(r) - t * t, 0.0F);
    return isPicked(angle, std::sqrt(squaredGap), t);
}

bool KpLine::intersect(float angle, const KpVec3f& p0, const KpVec3f& p1, KpVec3f& out) const
{
    KpVec3f onThis, onSegment;
    if (getClosestPoints(KpLine(p0, p1), onThis, onSegment)) {
        if ((p1 - p0).dot(onSegment - p0) < 0)
            onSegment = p0;
        else if ((p0 - p1).dot(onSegment - p1) < 0)
            onSegment = p1;
        // Intentional: the gap is measured between the nearest points of the unbounded lines, even
        // if an end of the segment is the result.
        const float gap = (onSegment - onThis).length();
        if (isPicked(angle, gap, (onThis - position_).length())) {
            out = onSegment;
            return true;
        }
    }
    out = nanVector;
    return false;
}
