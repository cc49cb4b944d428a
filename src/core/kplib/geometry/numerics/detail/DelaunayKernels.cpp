#include <kplib/geometry/numerics/detail/DelaunayKernels.h>

#include <kplib/geometry/numerics/detail/DelaunayCircle.h>

#include <bit>
#include <immintrin.h>

namespace kplib::detail::delaunay {
namespace {

template <int Size>
long scanFrom(long i, long count, const double* const* columns, long n, const double* point, std::int32_t* hits)
{
    Position<Size> at;
    for (int axis = 0; axis < Size; ++axis)
        at[axis] = point[axis];
    for (; i < n; ++i) {
        Circle<Size> circle;
        for (int axis = 0; axis < Size; ++axis)
            circle.center[axis] = columns[axis][i];
        circle.squaredRadius = columns[Size][i];
        if (contains<Size>(circle, at))
            hits[count++] = static_cast<std::int32_t>(i);
    }
    return count;
}

template <int Size>
long scanPlain(const double* const* columns, long n, const double* point, std::int32_t* hits)
{
    return scanFrom<Size>(0, 0, columns, n, point, hits);
}

/// Appends the positions of the bits of `mask`, which are few.
KPLIB_KERNEL_BODY long put(std::uint32_t mask, long first, std::int32_t* hits, long count)
{
    for (; mask != 0; mask &= mask - 1)
        hits[count++] = static_cast<std::int32_t>(first + std::countr_zero(mask));
    return count;
}

// By hand, since the compiler doesn't find the way from comparisons to positions. "Not less than" lets NaN pass.

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
std::span<const KernelPath<CircleScan>> circleScanPaths()
{
    static const KernelPath<CircleScan> paths[] = {
        {"plain", true, scanPlain<Size>},
        {"avx2", hasAvx2(), scanAvx2<Size>},
        {"avx512", hasAvx512(), scanAvx512<Size>},
    };
    return paths;
}

template std::span<const KernelPath<CircleScan>> circleScanPaths<2>();
template std::span<const KernelPath<CircleScan>> circleScanPaths<3>();

}  // namespace kplib::detail::delaunay
