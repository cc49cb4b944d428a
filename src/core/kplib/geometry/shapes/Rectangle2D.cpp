#include <kplib/geometry/shapes/Rectangle2D.h>

#include <algorithm>
#include <cmath>
#include <typeinfo>

namespace {

float clampedBetween(float value, float a, float b)
{
    return std::clamp(value, std::min(a, b), std::max(a, b));
}

}  // namespace

Rectangle2D::Rectangle2D(const KpVec2f& a, const KpVec2f& b) : upperLeft_(a), lowerRight_(b)
{
    if (std::make_pair(b.x(), b.y()) < std::make_pair(a.x(), a.y()))
        std::swap(upperLeft_, lowerRight_);
}

Rectangle2D Rectangle2D::fromCenterAndHalfSize(const KpVec2f& center, const KpVec2f& halfSize)
{
    Rectangle2D rectangle;
    rectangle.setCenterAndHalfSize(center, halfSize);
    return rectangle;
}

void Rectangle2D::setCenterAndHalfSize(const KpVec2f& center, const KpVec2f& halfSize)
{
    upperLeft_ = center - halfSize;
    lowerRight_ = center + halfSize;
}

Rectangle2D Rectangle2D::fromPositionAndSize(const KpVec2f& position, const KpVec2f& size)
{
    Rectangle2D rectangle;
    rectangle.setPositionAndSize(position, size);
    return rectangle;
}

void Rectangle2D::setPositionAndSize(const KpVec2f& position, const KpVec2f& size)
{
    upperLeft_ = position;
    lowerRight_ = position + size;
}

KpVec2f Rectangle2D::size() const
{
    const KpVec2f diagonal = lowerRight_ - upperLeft_;
    return {std::abs(diagonal.x()), std::abs(diagonal.y())};
}

bool Rectangle2D::contains(const KpVec2f& p) const
{
    return p.x() >= upperLeft_.x() && p.x() <= lowerRight_.x() && p.y() >= upperLeft_.y() && p.y() <= lowerRight_.y();
}

void Rectangle2D::merge(const Rectangle2D& other)
{
    for (int i = 0; i < 2; ++i) {
        upperLeft_[i] = std::min(upperLeft_[i], other.upperLeft_[i]);
        lowerRight_[i] = std::max(lowerRight_[i], other.lowerRight_[i]);
    }
}

std::vector<KpVec2f> Rectangle2D::vertices() const
{
    const KpVec2f upperRight(lowerRight_.x(), upperLeft_.y()), lowerLeft(upperLeft_.x(), lowerRight_.y());
    return {upperLeft_, upperRight, lowerRight_, lowerLeft, upperLeft_};
}

std::pair<bool, KpVec2f> Rectangle2D::closestPoint(KpVec2f p) const
{
    return {true, KpVec2f(clampedBetween(p.x(), upperLeft_.x(), lowerRight_.x()),
                          clampedBetween(p.y(), upperLeft_.y(), lowerRight_.y()))};
}

bool Rectangle2D::isEmpty() const
{
    return upperLeft_ == KpVec2f(0, 0) && lowerRight_ == KpVec2f(0, 0);
}

bool Rectangle2D::equals(const AbstractShape2D& other) const
{
    if (typeid(*this) != typeid(other))
        return false;
    const auto& rectangle = static_cast<const Rectangle2D&>(other);
    return upperLeft_ == rectangle.upperLeft_ && lowerRight_ == rectangle.lowerRight_;
}
