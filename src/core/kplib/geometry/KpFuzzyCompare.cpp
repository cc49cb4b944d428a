#include <kplib/geometry/KpFuzzyCompare.h>

#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/KpVec3f.h>

#include <algorithm>
#include <cmath>

namespace {

constexpr float relativeTo = 10000;

}  // namespace

bool kpFuzzyCompare(float a, float b)
{
    return std::min(std::abs(a), std::abs(b)) / relativeTo >= std::abs(a - b);
}

bool kpFuzzyCompare(float a, float b, float eps)
{
    return eps >= std::abs(a - b);
}

bool kpFuzzyCompare(const KpVec3f& a, const KpVec3f& b)
{
    const float tolerance = std::sqrt(std::min(a.squaredLength(), b.squaredLength())) / relativeTo;
    return kpFuzzyCompare(a, b, tolerance == 0 ? 1e-6F : tolerance);
}

bool kpFuzzyCompare(const KpVec3f& a, const KpVec3f& b, float eps)
{
    return eps * eps >= (a - b).squaredLength();
}

bool kpFuzzyCompare(const KpPlane& a, const KpPlane& b, float eps)
{
    const bool opposite = a.distance() * b.distance() < 0;
    const float distance = opposite ? -b.distance() : b.distance();
    const KpVec3f normal = opposite ? -b.normal() : b.normal();
    return std::abs(a.distance() - distance) <= eps && kpFuzzyCompare(a.normal(), normal);
}
