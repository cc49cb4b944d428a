#include <kplib/geometry/shapes/KpLine2D.h>

#include <algorithm>
#include <cmath>

namespace {

float crossOf(const KpVec2f& a, const KpVec2f& b)
{
    return a.x() * b.y() - a.y() * b.x();
}

bool isOnSegment(float parameter)
{
    return parameter >= 0 && parameter <= 1;
}

}  // namespace

bool KpLine2D::isEmpty() const
{
    const bool hasNaN = std::isnan(position_.x()) || std::isnan(position_.y()) || std::isnan(direction_.x()) ||
                        std::isnan(direction_.y());
    return hasNaN || direction_ == KpVec2f(0, 0);
}

float KpLine2D::getDistanceTo(const KpVec2f& p) const
{
    const float length = direction_.hypot();
    return length == 0 ? (p - position_).hypot() : crossOf(direction_, p - position_) / length;
}

float KpLine2D::getDistance2To(const KpVec2f& p) const
{
    const float distance = getDistanceTo(p);
    return distance * distance;
}

KpVec2f KpLine2D::getClosestPoint(const KpVec2f& p, bool clampToSegment) const
{
    KpVec2f unit = direction_;
    const float length = unit.normalize();
    float t = (p - position_).dot(unit);
    if (clampToSegment)
        t = t < 0 ? 0 : std::min(t, length);
    return position_ + unit * t;
}

void KpLine2D::translate(float distance)
{
    KpVec2f unit = direction_;
    unit.normalize();
    position_ += KpVec2f(-unit.y() * distance, unit.x() * distance);
}

bool KpLine2D::intersects(const KpLine2D& other, bool segmentsOnly, KpVec2f* out) const
{
    if (isEmpty() || other.isEmpty())
        return false;
    const float determinant = crossOf(direction_, other.direction_);
    if (determinant == 0)
        return false;
    const KpVec2f apart = other.position_ - position_;
    const float onOther = (direction_.y() * apart.x() - direction_.x() * apart.y()) / determinant;
    if (segmentsOnly && !(isOnSegment(onOther) && isOnSegment(crossOf(apart, other.direction_) / determinant)))
        return false;
    if (out)
        *out = other.position_ + other.direction_ * onOther;
    return true;
}
