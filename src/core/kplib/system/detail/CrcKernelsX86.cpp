#include <kplib/cpu/KernelPathX86.h>
#include <kplib/system/detail/CrcLoops.h>

#include <cstdint>
#include <immintrin.h>
#include <span>

namespace kplib::detail {

using namespace crc;

namespace {

// Folding, after V. Gopal et al., "Fast CRC Computation for Generic Polynomials Using PCLMULQDQ
// Instruction", 2009. A vector of 16 bytes is a polynomial of 128 bits, high * x^64 + low. To move
// it `distance` bits on, each half is multiplied by the remainder of its power of x, and the
// products are added to the data there:
//
//     v * x^distance = high * (x^(distance + 64) mod P) + low * (x^distance mod P)    (modulo P)
//
// So the last vector has the same remainder as all data before it, and crcSlicing() finishes it.

#define KPLIB_TARGET_PCLMUL KPLIB_TARGET("pclmul,ssse3")
#define KPLIB_TARGET_VPCLMUL KPLIB_TARGET("avx512f,avx512bw,vpclmulqdq")

template <int distance>
constexpr long long lowFactor = power(distance);
template <int distance>
constexpr long long highFactor = power(distance + 64);

KPLIB_TARGET_PCLMUL inline __m128i reversed(__m128i v)
{
    return _mm_shuffle_epi8(v, _mm_setr_epi8(15, 14, 13, 12, 11, 10, 9, 8, 7, 6, 5, 4, 3, 2, 1, 0));
}

KPLIB_TARGET_PCLMUL inline __m128i load16(const unsigned char* data)
{
    return reversed(_mm_loadu_si128(reinterpret_cast<const __m128i*>(data)));
}

// `v` moved by `distance` bits and added to `onto`.
template <int distance>
KPLIB_TARGET_PCLMUL inline __m128i fold(__m128i v, __m128i onto)
{
    const __m128i factors = _mm_set_epi64x(highFactor<distance>, lowFactor<distance>);
    const __m128i low = _mm_clmulepi64_si128(v, factors, 0x00), high = _mm_clmulepi64_si128(v, factors, 0x11);
    return _mm_xor_si128(_mm_xor_si128(low, high), onto);
}

KPLIB_TARGET_PCLMUL std::uint32_t crcPclmul(std::uint32_t crc, const unsigned char* data, long n)
{
    if (n < 64)
        return crcSlicing(crc, data, n);
    __m128i v[4];
    for (int i = 0; i < 4; ++i)
        v[i] = load16(data + 16 * i);
    v[0] = _mm_xor_si128(v[0], _mm_set_epi32(static_cast<int>(crc), 0, 0, 0));
    for (n -= 64, data += 64; n >= 64; n -= 64, data += 64) {
        for (int i = 0; i < 4; ++i)
            v[i] = fold<512>(v[i], load16(data + 16 * i));
    }
    for (int i = 1; i < 4; ++i)
        v[0] = fold<128>(v[0], v[i]);
    for (; n >= 16; n -= 16, data += 16)
        v[0] = fold<128>(v[0], load16(data));
    unsigned char rest[16];
    _mm_storeu_si128(reinterpret_cast<__m128i*>(rest), reversed(v[0]));
    return crcSlicing(crcSlicing(0, rest, 16), data, n);
}

KPLIB_TARGET_VPCLMUL inline __m512i reversed(__m512i v)
{
    return _mm512_shuffle_epi8(
        v, _mm512_broadcast_i32x4(_mm_setr_epi8(15, 14, 13, 12, 11, 10, 9, 8, 7, 6, 5, 4, 3, 2, 1, 0)));
}

KPLIB_TARGET_VPCLMUL inline __m512i load64(const unsigned char* data)
{
    return reversed(_mm512_loadu_si512(data));
}

template <int distance>
KPLIB_TARGET_VPCLMUL inline __m512i fold(__m512i v, __m512i onto)
{
    const __m512i factors = _mm512_broadcast_i32x4(_mm_set_epi64x(highFactor<distance>, lowFactor<distance>));
    const __m512i low = _mm512_clmulepi64_epi128(v, factors, 0x00), high = _mm512_clmulepi64_epi128(v, factors, 0x11);
    return _mm512_ternarylogic_epi64(low, high, onto, 0x96);  // exclusive or of all three
}

// Four folds in each instruction. crcPclmul() takes the last 64 bytes as if they were data.
KPLIB_TARGET_VPCLMUL std::uint32_t crcVpclmul(std::uint32_t crc, const unsigned char* data, long n)
{
    if (n < 256)
        return crcPclmul(crc, data, n);
    __m512i v[4];
    for (int i = 0; i < 4; ++i)
        v[i] = load64(data + 64 * i);
    v[0] = _mm512_xor_si512(v[0], _mm512_zextsi128_si512(_mm_set_epi32(static_cast<int>(crc), 0, 0, 0)));
    for (n -= 256, data += 256; n >= 256; n -= 256, data += 256) {
        for (int i = 0; i < 4; ++i)
            v[i] = fold<2048>(v[i], load64(data + 64 * i));
    }
    for (int i = 1; i < 4; ++i)
        v[0] = fold<512>(v[0], v[i]);
    unsigned char rest[64];
    _mm512_storeu_si512(rest, reversed(v[0]));
    return crcPclmul(crcPclmul(0, rest, 64), data, n);
}

bool hasPclmul()
{
    return __builtin_cpu_supports("pclmul") && __builtin_cpu_supports("ssse3");
}

bool hasVpclmul()
{
    return hasPclmul() && __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
           __builtin_cpu_supports("vpclmulqdq");
}

}  // namespace

std::span<const KernelPath<CrcLoop>> crcX86()
{
    static const KernelPath<CrcLoop> paths[] = {
        {"pclmul", hasPclmul(), crcPclmul},
        {"vpclmul", hasVpclmul(), crcVpclmul},
    };
    return paths;
}

}  // namespace kplib::detail
