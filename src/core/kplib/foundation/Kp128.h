#pragma once

#include <compare>
#include <cstddef>
#include <cstdint>
#include <typeindex>  // declares std::hash

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

/// Both words.
template <>
struct std::hash<Kp128> {
    /// Exclusive or of the words, the second rotated by half, so that equal words do not cancel.
    std::size_t operator()(const Kp128& value) const { return value.first ^ (value.second << 32 | value.second >> 32); }
};
