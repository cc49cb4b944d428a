#pragma once

#include <kplib/geometry/KpVec3f.h>

#include <limits>

namespace kplib::detail {

// What stands for a point or a direction that there isn't, so that who ignores a false return goes on with NaN.
inline constexpr KpVec3f nanVector(std::numeric_limits<float>::quiet_NaN(), std::numeric_limits<float>::quiet_NaN(),
                                   std::numeric_limits<float>::quiet_NaN());

}  // namespace kplib::detail
