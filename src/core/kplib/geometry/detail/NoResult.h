#pragma once

#include <kplib/geometry/KpVec3f.h>

#include <limits>

namespace kplib::detail {

// The value of a point or a direction that does not exist: a caller that ignores a false return
// continues with NaN.
inline constexpr KpVec3f nanVector(std::numeric_limits<float>::quiet_NaN(), std::numeric_limits<float>::quiet_NaN(),
                                   std::numeric_limits<float>::quiet_NaN());

}  // namespace kplib::detail
