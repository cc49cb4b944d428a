#pragma once

#include <cstdint>
#include <cstring>

namespace kplib::detail {

// Eight flag bytes, given as one number with the first in its lowest byte, as eight bits: set where the byte isn't 0.
inline std::uint64_t bitsOfEight(std::uint64_t flags)
{
    constexpr std::uint64_t low = 0x7F7F7F7F7F7F7F7F;
    const std::uint64_t highBits = (((flags & low) + low) | flags) & ~low;
    return (highBits >> 7) * 0x0102040810204080 >> 56;  // gathers one bit from each byte
}

// `n` flags from an address on as bits; 64 at most.
inline std::uint64_t bitsOfFlags(const unsigned char* flags, long n)
{
    std::uint64_t bits = 0, eight = 0;
    long i = 0;
    for (; i + 8 <= n; i += 8) {
        std::memcpy(&eight, flags + i, 8);
        bits |= bitsOfEight(eight) << i;
    }
    if (i < n) {
        eight = 0;
        std::memcpy(&eight, flags + i, static_cast<std::size_t>(n - i));
        bits |= bitsOfEight(eight) << i;
    }
    return bits;
}

}  // namespace kplib::detail
