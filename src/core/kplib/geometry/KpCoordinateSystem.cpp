#include <kplib/geometry/KpCoordinateSystem.h>

#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/MathUtils.h>
#include <kplib/geometry/detail/NoResult.h>

#include <algorithm>
#include <cmath>

using kplib::detail::nanVector;

namespace {

bool isNaN(const KpVec3f& v)
{
    return std::any_of(v.begin(), v.end(), [](float c) { return std::isnan(c); });
}

KpVec3f normalized(KpVec3f v)
{
    v.normalize();
    return v;
}

bool axesMatch(KpVec3f a, KpVec3f b)
{
    constexpr float tolerance = 0.0001F;
    const float lengthA = a.normalize();
    const float lengthB = b.normalize();
    if (lengthA == 0 || lengthB == 0)
        return lengthA == lengthB;
    return std::abs(lengthA - lengthB) < tolerance && std::abs(a.dot(b) - 1) < tolerance;
}

}  // namespace

KpCoordinateSystem::KpCoordinateSystem(const KpVec3f& origin, const std::array<KpVec3f, 3>& axes) :
    origin_(origin), axes_(axes)
{
    if (!isValid())
        makeNaN();
}

void KpCoordinateSystem::setByMatrix(const KpMat4f& matrix)
{
    const auto row = [&](int i) { return KpVec3f(matrix[i][0], matrix[i][1], matrix[i][2]); };
    axes_ = {row(0), row(1), row(2)};
    origin_ = row(3);
}

void KpCoordinateSystem::makeIdentity()
{
    setByMatrix(KpMat4f::identity());
}

void KpCoordinateSystem::makeNaN()
{
    origin_ = nanVector;
    axes_.fill(origin_);
}

void KpCoordinateSystem::setAxes(const KpVec3f& zAxis, const KpVec3f& xHint)
{
    const KpVec3f z = normalized(zAxis);
    const bool isAnyX = xHint == KpVec3f(0, 0, 0);
    const KpVec3f hint = normalized(isAnyX ? MathUtils::getPerpendicularVector(z) : xHint);
    const KpVec3f y = normalized(z.cross(hint));
    axes_ = {normalized(y.cross(z)), y, z};
}

void KpCoordinateSystem::setAxesByRotation(const KpRotation& rotation)
{
    axes_ = {rotation * KpVec3f(1, 0, 0), rotation * KpVec3f(0, 1, 0), rotation * KpVec3f(0, 0, 1)};
}

void KpCoordinateSystem::makePerpendicular(int axis, bool keepDirection)
{
    const auto first = static_cast<std::size_t>(axis);
    const KpVec3f kept = axes_[first];
    KpVec3f& second = axes_[(first + 1) % 3];
    KpVec3f& third = axes_[(first + 2) % 3];
    const KpVec3f newThird = kept.cross(second);
    const KpVec3f newSecond = newThird.cross(kept);
    const auto replace = [&](KpVec3f& old, const KpVec3f& value) {
        old = keepDirection && value.dot(old) < 0 ? -value : value;
    };
    replace(second, newSecond);
    replace(third, newThird);
}

void KpCoordinateSystem::normalizeAxes()
{
    for (KpVec3f& axis : axes_)
        axis.normalize();
}

void KpCoordinateSystem::setSystemByPlane(const KpPlane& plane, const KpVec3f& point)
{
    if (plane.isEmpty()) {
        origin_ = nanVector;
        return;
    }
    origin_ = point;
    const KpVec3f z = normalized(plane.normal());
    const KpVec3f x = normalized(MathUtils::getPerpendicularVector(z));
    axes_ = {x, normalized(z.cross(x)), z};
}

void KpCoordinateSystem::setSystemByPlane(const KpPlane& plane)
{
    setSystemByPlane(plane, plane.getProjectedPoint(KpVec3f(0, 0, 0)));
}

bool KpCoordinateSystem::isValid() const
{
    return !isNaN(origin_) && std::none_of(axes_.begin(), axes_.end(), isNaN) &&
           MathUtils::areLinearlyIndependent(axes_[0], axes_[1], axes_[2]);
}

bool KpCoordinateSystem::isPerpendicular() const
{
    return MathUtils::arePerpendicular(axes_[0], axes_[1]) && MathUtils::arePerpendicular(axes_[1], axes_[2]) &&
           MathUtils::arePerpendicular(axes_[0], axes_[2]);
}

bool KpCoordinateSystem::isRightHanded() const
{
    return axes_[0].dot(axes_[1].cross(axes_[2])) > 0;
}

bool KpCoordinateSystem::equals(const KpCoordinateSystem& other, float tolerance) const
{
    const KpVec3f difference = origin_ - other.origin_;
    return std::all_of(difference.begin(), difference.end(), [&](float d) { return std::abs(d) < tolerance; }) &&
           equalsAxis(other);
}

bool KpCoordinateSystem::equalsAxis(const KpCoordinateSystem& other) const
{
    return std::equal(axes_.begin(), axes_.end(), other.axes_.begin(), axesMatch);
}

KpMat4f KpCoordinateSystem::asTransformation() const
{
    KpMat4f matrix;
    matrix.setValue(axes_[0], axes_[1], axes_[2], origin_);
    return matrix;
}

std::string KpCoordinateSystem::dump() const
{
    return R"("KpCoordinateSystem":{"origin":)" + origin_.dump() + R"(,"x_axis":)" + axes_[0].dump() + R"(,"y_axis":)" +
           axes_[1].dump() + R"(,"z_axis":)" + axes_[2].dump() + R"(,"parent": {)" +
           (parent_ ? parent_->dump() : std::string()) + "}}";
}
