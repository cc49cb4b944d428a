#include <kplib/cpu/KernelPathX86.h>
#include <kplib/geometry/detail/Mat4fLoops.h>

#include <immintrin.h>

namespace kplib::detail {
namespace {

// Intrinsics, three lanes of four: compilers handle each element by itself, which takes twice the
// time. The cross products of the rows are the columns of the adjugate. Products of two floats are
// exact in double, so the order of the first two factors in a term of the determinant does not
// matter.

KPLIB_TARGET_AVX2 inline __m256d turnedLeft(__m256d v)
{
    return _mm256_permute4x64_pd(v, _MM_SHUFFLE(3, 0, 2, 1));
}

KPLIB_TARGET_AVX2 inline __m256d turnedRight(__m256d v)
{
    return _mm256_permute4x64_pd(v, _MM_SHUFFLE(3, 1, 0, 2));
}

// Adds the first three lanes of `terms`, one by one, to the sums of (positive, negative).
KPLIB_TARGET_AVX2 inline __m128d added(__m128d sums, __m256d terms)
{
    const __m256d positive = _mm256_max_pd(terms, _mm256_setzero_pd());
    const __m256d negative = _mm256_min_pd(_mm256_setzero_pd(), terms);  // this way round NaN is in
    const __m256d evens = _mm256_unpacklo_pd(positive, negative), odd = _mm256_unpackhi_pd(positive, negative);
    sums = sums + _mm256_castpd256_pd128(evens);
    sums = sums + _mm256_castpd256_pd128(odd);
    return sums + _mm256_extractf128_pd(evens, 1);
}

KPLIB_TARGET_AVX2 bool invertAvx2(const float* in, float* out)
{
    const __m256d a0 = _mm256_cvtps_pd(_mm_loadu_ps(in));
    const __m256d a1 = _mm256_cvtps_pd(_mm_loadu_ps(in + 4));
    const __m256d a2 = _mm256_cvtps_pd(_mm_loadu_ps(in + 8));
    const __m256d l0 = turnedLeft(a0), l1 = turnedLeft(a1), l2 = turnedLeft(a2);
    const __m256d r0 = turnedRight(a0), r1 = turnedRight(a1), r2 = turnedRight(a2);

    const __m256d plus = l1 * r2, minus = r1 * l2;
    __m128d sums = added(_mm_setzero_pd(), a0 * plus);
    sums = added(sums, -a0 * minus);
    const double positive = _mm_cvtsd_f64(sums), negative = _mm_cvtsd_f64(_mm_unpackhi_pd(sums, sums));
    if (isSingular(positive, negative))
        return false;

    const __m256d scale = _mm256_set1_pd(1 / (positive + negative));
    const __m128 column0 = _mm256_cvtpd_ps((plus - minus) * scale);
    const __m128 column1 = _mm256_cvtpd_ps((l2 * r0 - r2 * l0) * scale);
    const __m128 column2 = _mm256_cvtpd_ps((l0 * r1 - r0 * l1) * scale);
    const __m128 last = _mm_insert_ps(column2, column2, 0x08);
    const __m128 low = _mm_unpacklo_ps(column0, column1), high = _mm_unpackhi_ps(column0, column1);
    const __m128 row0 = _mm_shuffle_ps(low, last, _MM_SHUFFLE(3, 0, 1, 0));
    const __m128 row1 = _mm_shuffle_ps(low, last, _MM_SHUFFLE(3, 1, 3, 2));
    const __m128 row2 = _mm_shuffle_ps(high, last, _MM_SHUFFLE(3, 2, 1, 0));
    const __m128 row3 = -(in[12] * row0 + in[13] * row1 + in[14] * row2);
    _mm_storeu_ps(out, row0);
    _mm_storeu_ps(out + 4, row1);
    _mm_storeu_ps(out + 8, row2);
    _mm_storeu_ps(out + 12, _mm_blend_ps(row3, _mm_set1_ps(1), 8));
    return true;
}

}  // namespace

std::span<const KernelPath<TransformLoop>> transformX86()
{
    static const KernelPath<TransformLoop> paths[] = {
        {"avx2", hasAvx2(), ForAvx2::run<TransformTogether<8>>},
        {"avx512", hasAvx512(), ForAvx512::run<TransformTogether<16>>},
    };
    return paths;
}

std::span<const KernelPath<AffineInverse>> affineInverseX86()
{
    static const KernelPath<AffineInverse> paths[] = {{"avx2", hasAvx2(), invertAvx2}};
    return paths;
}

}  // namespace kplib::detail
