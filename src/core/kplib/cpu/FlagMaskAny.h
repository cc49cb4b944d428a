#pragma once

#include <cstdint>
#include <cstring>

namespace kplib::detail {

// 64 flags, each 0 or 1, as bits.
inline std::uint64_t bitsOf64Flags(const unsigned char* flags)
{
    std::uint64_t bits = 0;
    for (int i = 0; i < 64; i += 8) {
        std::uint64_t eight;
        std::memcpy(&eight, flags + i, 8);
        bits |= eight * 0x0102040810204080 >> 56 << i;  // gathers one bit from each byte
    }
    return bits;
}

}  // namespace kplib::detail
