#pragma once

#include <compare>
#include <cstdint>

/// A plain value of 128 bits: two unsigned words, of which the first decides the order.
struct Kp128 {
    /// @{
    /// One word, as it is in memory.
    std::uint64_t first = 0;
    std::uint64_t second = 0;
    /// @}

    /// Compares `first` and then `second`.
    friend constexpr auto operator<=>(const Kp128& a, const Kp128& b) = default;
};

static_assert(sizeof(Kp128) == 16);
