#include "PlainConvert.h"

#include <algorithm>
#include <cstdint>
#include <limits>
#include <type_traits>

namespace kplib::bench {

template <typename To, typename From>
void plainConvert(To* dst, const From* src, long n)
{
    for (long i = 0; i < n; ++i) {
        if constexpr (std::is_floating_point_v<To>)
            dst[i] = src[i];
        else
            dst[i] = static_cast<To>(
                std::clamp<From>(src[i], std::numeric_limits<To>::min(), static_cast<From>(std::numeric_limits<To>::max())));
    }
}

template void plainConvert(std::uint8_t*, const std::uint16_t*, long);
template void plainConvert(std::int16_t*, const float*, long);
template void plainConvert(std::uint8_t*, const double*, long);
template void plainConvert(float*, const std::int16_t*, long);

}  // namespace kplib::bench
