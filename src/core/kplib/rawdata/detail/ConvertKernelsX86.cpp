#include <kplib/cpu/KernelPathX86.h>
#include <kplib/rawdata/detail/ConvertLoops.h>

#include <cstdint>
#include <immintrin.h>
#include <span>
#include <type_traits>

namespace kplib::detail {

using namespace convert;

namespace {

// Real to integer with intrinsics, 16 elements at a time: the processor's cast has the required
// results for NaN and large values, which no C++ expression has. Two to three times as fast as
// EachElement for the same processor.
#define KPLIB_LANES KPLIB_TARGET_AVX512 KPLIB_KERNEL_BODY

struct Doubles16 {
    __m512d low, high;
};

KPLIB_LANES __m512 singles(const Loose<float>* p)
{
    return _mm512_loadu_ps(p);
}
KPLIB_LANES __m512 singles(const Loose<std::int32_t>* p)
{
    return _mm512_cvtepi32_ps(_mm512_loadu_si512(p));
}
KPLIB_LANES __m512 singles(const Loose<std::int16_t>* p)
{
    return _mm512_cvtepi32_ps(_mm512_cvtepi16_epi32(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(p))));
}
KPLIB_LANES __m512 singles(const Loose<std::uint16_t>* p)
{
    return _mm512_cvtepi32_ps(_mm512_cvtepu16_epi32(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(p))));
}
KPLIB_LANES __m512 singles(const Loose<std::uint8_t>* p)
{
    return _mm512_cvtepi32_ps(_mm512_cvtepu8_epi32(_mm_loadu_si128(reinterpret_cast<const __m128i*>(p))));
}
KPLIB_LANES __m512 singles(const Loose<double>* p)
{
    const __m512 low = _mm512_castps256_ps512(_mm512_cvtpd_ps(_mm512_loadu_pd(p)));
    return _mm512_insertf32x8(low, _mm512_cvtpd_ps(_mm512_loadu_pd(p + 8)), 1);
}

template <typename Real, typename From>
KPLIB_LANES auto lanes(const Loose<From>* p)
{
    if constexpr (std::is_same_v<Real, float>)
        return singles(p);
    else
        return Doubles16{_mm512_loadu_pd(p), _mm512_loadu_pd(p + 8)};
}

template <typename Number, typename Lanes>
KPLIB_LANES Lanes mapped(const Unmapped<Number>&, Lanes v)
{
    return v;
}
KPLIB_LANES __m512 mapped(const Linear<float>& map, __m512 v)
{
    return _mm512_mul_ps(_mm512_add_ps(v, _mm512_set1_ps(map.offset)), _mm512_set1_ps(map.scale));
}
KPLIB_LANES Doubles16 mapped(const Linear<double>& map, Doubles16 v)
{
    const __m512d offset = _mm512_set1_pd(map.offset), scale = _mm512_set1_pd(map.scale);
    return {_mm512_mul_pd(_mm512_add_pd(v.low, offset), scale), _mm512_mul_pd(_mm512_add_pd(v.high, offset), scale)};
}

// The bound is the first operand: minimum and maximum give their second operand if either is NaN.
KPLIB_LANES __m512i truncated(__m512 v, float low, float high)
{
    return _mm512_cvttps_epi32(_mm512_min_ps(_mm512_set1_ps(high), _mm512_max_ps(_mm512_set1_ps(low), v)));
}
KPLIB_LANES __m256i truncated(__m512d v, double low, double high)
{
    return _mm512_cvttpd_epi32(_mm512_min_pd(_mm512_set1_pd(high), _mm512_max_pd(_mm512_set1_pd(low), v)));
}
KPLIB_LANES __m512i truncated(Doubles16 v, double low, double high)
{
    return _mm512_inserti64x4(_mm512_castsi256_si512(truncated(v.low, low, high)), truncated(v.high, low, high), 1);
}

template <typename To>
KPLIB_LANES void storeCut(Loose<To>* p, __m512i v)
{
    if constexpr (sizeof(To) == 1)
        _mm_storeu_si128(reinterpret_cast<__m128i*>(p), _mm512_cvtepi32_epi8(v));
    else if constexpr (sizeof(To) == 2)
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(p), _mm512_cvtepi32_epi16(v));
    else
        _mm512_storeu_si512(p, v);
}

template <typename To, typename From, typename Map>
KPLIB_TARGET_AVX512 void eachSixteen(void* dst, const void* src, long n, Map map)
{
    using Real = typename Map::Real;
    using Bounds = RealBounds<To, Real>;
    auto* to = static_cast<Loose<To>*>(dst);
    auto* from = static_cast<const Loose<From>*>(src);
    long i = 0;
    for (; i + 16 <= n; i += 16)
        storeCut(to + i, truncated(mapped(map, lanes<Real>(from + i)), Bounds::low, Bounds::high));
    EachElement<To, From, Map>::run(to + i, from + i, n - i, map);
}

struct RowsAvx512 {
    template <typename To, typename From, typename Map>
    static void each(void* dst, const void* src, long n, Map map)
    {
        if constexpr (std::is_integral_v<To> && std::is_floating_point_v<typename Map::Real>)
            eachSixteen<To, From>(dst, src, n, map);
        else
            Rows<ForAvx512>::each<To, From>(dst, src, n, map);
    }
};

}  // namespace

std::span<const KernelPath<ConvertLoops>> convertX86()
{
    static const KernelPath<ConvertLoops> paths[] = {{"avx2", hasAvx2(), convertLoop<Rows<ForAvx2>>},
                                                     {"avx512", hasAvx512(), convertLoop<RowsAvx512>}};
    return paths;
}

std::span<const KernelPath<MapLoops>> mapX86()
{
    static const KernelPath<MapLoops> paths[] = {{"avx2", hasAvx2(), mapLoop<Rows<ForAvx2>>},
                                                 {"avx512", hasAvx512(), mapLoop<RowsAvx512>}};
    return paths;
}

}  // namespace kplib::detail
