#pragma once

#include <kplib/cpu/KernelPath.h>

#include <cstdint>
#include <limits>
#include <type_traits>

namespace kplib::detail {

// `value` limited to [low, high]. NaN is unchanged.
template <typename T>
KPLIB_KERNEL_BODY T clamped(T value, T low, T high)
{
    value = low > value ? low : value;
    return value > high ? high : value;
}

// Truncates values not below the smallest int. NaN and values above the largest int become the
// smallest, as the processor converts them. The test is before the cast: a cast out of range is
// undefined, and compilers exploit that.
template <typename Real>
KPLIB_KERNEL_BODY std::int32_t truncatedToInt(Real value)
{
    return static_cast<std::int32_t>(value < Real(2147483648.0) ? value : Real(-2147483648.0));
}

// The bounds of a conversion from real numbers. Intentional for int, since peers depend on them:
// from float the upper bound is one above the largest int, so all values from there on become the
// smallest int; from double the lower bound is two above the smallest int.
template <typename Integer, typename Real>
struct RealBounds {
    static constexpr Real low = std::numeric_limits<Integer>::min();
    static constexpr Real high = std::numeric_limits<Integer>::max();
};
template <>
struct RealBounds<std::int32_t, float> {
    static constexpr float low = -2147483648.0f, high = 2147483648.0f;
};
template <>
struct RealBounds<std::int32_t, double> {
    static constexpr double low = -2147483646.0, high = 2147483647.0;
};

// One element in another type: clamped, then cut towards zero, never rounded.
template <typename To, typename From>
KPLIB_KERNEL_BODY To converted(From value)
{
    static_assert(sizeof(To) <= 4 || std::is_floating_point_v<To>,
                  "a wider integer is clamped as 32 bits here: extend it");
    static_assert(sizeof(From) <= 4 || std::is_floating_point_v<From>,
                  "a wider integer is read as 32 bits here: extend it");
    // Intentional: ushort to short keeps the bits and does not clamp. Peers depend on it.
    constexpr bool keepsBits = std::is_same_v<To, std::int16_t> && std::is_same_v<From, std::uint16_t>;
    if constexpr (std::is_floating_point_v<To> || keepsBits) {
        return static_cast<To>(value);
    } else if constexpr (std::is_floating_point_v<From>) {
        using Bounds = RealBounds<To, From>;
        return static_cast<To>(truncatedToInt(clamped(value, Bounds::low, Bounds::high)));
    } else {
        using Limits = std::numeric_limits<To>;
        return static_cast<To>(clamped<std::int32_t>(value, Limits::min(), Limits::max()));
    }
}

// The precision in which a linear map from one type to another is computed.
template <typename To, typename From>
using MapReal =
    std::conditional_t<std::is_same_v<To, double> || (std::is_same_v<From, double> && sizeof(To) == sizeof(float)),
                       double, float>;

}  // namespace kplib::detail
