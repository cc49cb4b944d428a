#pragma once

#include <kplib/geometry/KpVec2f.h>

#include <cmath>

namespace kplib::detail {

/// As KpVec2f::normalize() measures: hypot() in double, rounded.
inline float length2D(const KpVec2f& v)
{
    return static_cast<float>(std::hypot(static_cast<double>(v.x()), static_cast<double>(v.y())));
}

}  // namespace kplib::detail
