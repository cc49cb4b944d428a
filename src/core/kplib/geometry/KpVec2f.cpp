#include <kplib/geometry/KpVec2f.h>

#include <cmath>
#include <numbers>

float KpVec2f::hypot() const
{
    return static_cast<float>(std::hypot(static_cast<double>(x()), static_cast<double>(y())));
}

float KpVec2f::normalize()
{
    const float length = this->hypot();
    if (length != 0)
        *this /= length;
    return length;
}

float KpVec2f::angle(const KpVec2f& other) const
{
    const double lengths = std::hypot(static_cast<double>(x()), static_cast<double>(y())) *
                           std::hypot(static_cast<double>(other.x()), static_cast<double>(other.y()));
    const double cosine = static_cast<double>(dot(other)) / lengths;
    if (cosine < -1)
        return std::numbers::pi_v<float>;
    if (cosine > 1)
        return 0;
    return static_cast<float>(std::acos(cosine));
}
