#include <kplib/geometry/MathUtils.h>

#include <cmath>
#include <numbers>

namespace {

constexpr float twoPi = 2 * std::numbers::pi_v<float>;

KpVec3f normalized(KpVec3f v)
{
    v.normalize();
    return v;
}

}  // namespace

float MathUtils::angleBetweenVectors(const KpVec3f& a, const KpVec3f& b, const KpVec3f& reference)
{
    const KpVec3f from = normalized(a);
    const KpVec3f to = normalized(b);
    // In double: the C library's functions of float differ in their last bit between processors.
    const auto sine = static_cast<double>(from.cross(to).dot(normalized(reference)));
    const auto cosine = static_cast<double>(from.dot(to));
    auto angle = static_cast<float>(std::atan2(sine, cosine));
    if (angle < 0)
        angle += twoPi;
    return angle == twoPi ? 0 : angle;
}

bool MathUtils::haveSameSpaceOrientation(const KpVec3f& a, const KpVec3f& b)
{
    return a.dot(b) > 0;
}

bool MathUtils::areParallel(const KpVec3f& a, const KpVec3f& b, float tolerance)
{
    return normalized(a).cross(normalized(b)).length() < tolerance;
}

bool MathUtils::areLinearlyIndependent(const KpVec3f& a, const KpVec3f& b, const KpVec3f& c)
{
    return a.dot(b.cross(c)) != 0;
}

bool MathUtils::arePerpendicular(const KpVec3f& a, const KpVec3f& b)
{
    const auto product = static_cast<double>(a.dot(b));
    return -1e-6 < product && product < 1e-6;
}

KpVec3f MathUtils::getPerpendicularVector(const KpVec3f& v)
{
    int smallest = 0;
    for (int axis = 1; axis < 3; ++axis) {
        if (std::abs(v[axis]) < std::abs(v[smallest]))
            smallest = axis;
    }
    KpVec3f unit(0, 0, 0);
    unit[smallest] = 1;
    return v.cross(unit);
}
