#pragma once

#include <cstdint>
#include <emmintrin.h>

namespace kplib::detail {

// 64 flags, each 0 or 1, as bits. Inline: the flags may still be in registers.
inline std::uint64_t bitsOf64Flags(const unsigned char* flags)
{
    std::uint64_t bits = 0;
    for (int i = 0; i < 4; ++i) {
        const __m128i sixteen = _mm_loadu_si128(reinterpret_cast<const __m128i*>(flags) + i);
        const int mask = _mm_movemask_epi8(_mm_cmpgt_epi8(sixteen, _mm_setzero_si128()));
        bits |= static_cast<std::uint64_t>(static_cast<unsigned>(mask)) << 16 * i;
    }
    return bits;
}

}  // namespace kplib::detail
