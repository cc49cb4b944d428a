#include <kplib/cpu/KernelPathX86.h>
#include <kplib/geometry/numerics/detail/DelaunayLoops.h>

#include <bit>
#include <cstdint>
#include <immintrin.h>
#include <span>

namespace kplib::detail::delaunay {
namespace {

// Appends the positions of the bits of `mask`, which are few.
KPLIB_KERNEL_BODY long put(std::uint32_t mask, long first, std::int32_t* hits, long count)
{
    for (; mask != 0; mask &= mask - 1)
        hits[count++] = static_cast<std::int32_t>(first + std::countr_zero(mask));
    return count;
}

// Intrinsics, since the compiler does not vectorise the step from comparisons to positions. "Not
// less than" lets NaN pass.

template <int Size>
KPLIB_TARGET_AVX2 std::uint32_t hitsAvx2(const double* const* columns, long i, const double* point)
{
    __m256d rest = _mm256_loadu_pd(columns[Size] + i);
    __m256d inside = _mm256_castsi256_pd(_mm256_set1_epi64x(-1));
    for (int axis = 0; axis < Size; ++axis) {
        const __m256d d = _mm256_sub_pd(_mm256_set1_pd(point[axis]), _mm256_loadu_pd(columns[axis] + i));
        rest = _mm256_sub_pd(rest, _mm256_mul_pd(d, d));
        inside = _mm256_and_pd(inside, _mm256_cmp_pd(rest, _mm256_setzero_pd(), _CMP_NLT_UQ));
    }
    return static_cast<std::uint32_t>(_mm256_movemask_pd(inside));
}

template <int Size>
KPLIB_TARGET_AVX2 long scanAvx2(const double* const* columns, long n, const double* point, std::int32_t* hits)
{
    long count = 0, i = 0;
    for (; i + 8 <= n; i += 8) {
        const std::uint32_t mask = hitsAvx2<Size>(columns, i, point) | hitsAvx2<Size>(columns, i + 4, point) << 4;
        count = put(mask, i, hits, count);
    }
    return scanFrom<Size>(i, count, columns, n, point, hits);
}

template <int Size>
KPLIB_TARGET_AVX512 std::uint32_t hitsAvx512(const double* const* columns, long i, const double* point)
{
    __m512d rest = _mm512_loadu_pd(columns[Size] + i);
    std::uint32_t inside = 255;
    for (int axis = 0; axis < Size; ++axis) {
        const __m512d d = _mm512_sub_pd(_mm512_set1_pd(point[axis]), _mm512_loadu_pd(columns[axis] + i));
        rest = _mm512_sub_pd(rest, _mm512_mul_pd(d, d));
        inside &= _mm512_cmp_pd_mask(rest, _mm512_setzero_pd(), _CMP_NLT_UQ);
    }
    return inside;
}

template <int Size>
KPLIB_TARGET_AVX512 long scanAvx512(const double* const* columns, long n, const double* point, std::int32_t* hits)
{
    long count = 0, i = 0;
    for (; i + 16 <= n; i += 16) {
        const std::uint32_t mask = hitsAvx512<Size>(columns, i, point) | hitsAvx512<Size>(columns, i + 8, point) << 8;
        count = put(mask, i, hits, count);
    }
    return scanFrom<Size>(i, count, columns, n, point, hits);
}

}  // namespace

template <int Size>
std::span<const KernelPath<CircleScan>> circleScanX86()
{
    static const KernelPath<CircleScan> paths[] = {
        {"avx2", hasAvx2(), scanAvx2<Size>},
        {"avx512", hasAvx512(), scanAvx512<Size>},
    };
    return paths;
}

template std::span<const KernelPath<CircleScan>> circleScanX86<2>();
template std::span<const KernelPath<CircleScan>> circleScanX86<3>();

}  // namespace kplib::detail::delaunay
