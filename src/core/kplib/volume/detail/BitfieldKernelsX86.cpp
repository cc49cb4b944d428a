#include <kplib/cpu/KernelPathX86.h>
#include <kplib/volume/detail/BitfieldLoops.h>

#include <cstdint>
#include <cstring>
#include <immintrin.h>
#include <iterator>
#include <numeric>
#include <span>

namespace kplib::detail {

using namespace bits;

namespace {

// With intrinsics: without the instruction the compiler counts a word in about twelve steps.
KPLIB_TARGET("popcnt") unsigned long countPopcnt(const BitWord* words, unsigned long n)
{
    unsigned long count = 0, i = 0;
    for (; i + 2 <= n; i += 2) {
        std::uint64_t pair;
        std::memcpy(&pair, words + i, sizeof pair);
        count += static_cast<unsigned long>(_mm_popcnt_u64(pair));
    }
    return count + countPlain(words + i, n - i);
}

KPLIB_TARGET("avx512f,avx512vpopcntdq") unsigned long countAvx512(const BitWord* words, unsigned long n)
{
    __m512i counts[4] = {};
    unsigned long i = 0;
    for (; i + 64 <= n; i += 64) {
        for (unsigned long k = 0; k < 4; ++k)
            counts[k] = _mm512_add_epi64(counts[k], _mm512_popcnt_epi64(_mm512_loadu_si512(words + i + 16 * k)));
    }
    std::uint64_t sums[32];
    std::memcpy(sums, counts, sizeof sums);
    return std::accumulate(std::begin(sums), std::end(sums), countPlain(words + i, n - i));
}

}  // namespace

std::span<const KernelPath<CountLoop>> countX86()
{
    static const KernelPath<CountLoop> paths[] = {
        {"popcnt", static_cast<bool>(__builtin_cpu_supports("popcnt")), countPopcnt},
        {"avx512", __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512vpopcntdq"), countAvx512}};
    return paths;
}

std::span<const KernelPath<FindLoop>> findFirstX86()
{
    static const KernelPath<FindLoop> paths[] = {{"avx2", hasAvx2(), ForAvx2::run<FindFirstByBlocks>},
                                                 {"avx512", hasAvx512(), ForAvx512::run<FindFirstByBlocks>}};
    return paths;
}

std::span<const KernelPath<FindLoop>> findLastX86()
{
    static const KernelPath<FindLoop> paths[] = {{"avx2", hasAvx2(), ForAvx2::run<FindLastByBlocks>}};
    return paths;
}

template <typename Op>
std::span<const KernelPath<CombineLoop>> combineX86()
{
    static const KernelPath<CombineLoop> paths[] = {{"avx2", hasAvx2(), ForAvx2::run<Combine<Op>>}};
    return paths;
}
template std::span<const KernelPath<CombineLoop>> combineX86<BitAnd>();
template std::span<const KernelPath<CombineLoop>> combineX86<BitOr>();
template std::span<const KernelPath<CombineLoop>> combineX86<BitXor>();

template <typename Op>
std::span<const KernelPath<AnyLoop>> anyX86()
{
    static const KernelPath<AnyLoop> paths[] = {{"avx2", hasAvx2(), ForAvx2::run<AnyByBlocks<Op>>},
                                                {"avx512", hasAvx512(), ForAvx512::run<AnyByBlocks<Op>>}};
    return paths;
}
template std::span<const KernelPath<AnyLoop>> anyX86<BitAnd>();
template std::span<const KernelPath<AnyLoop>> anyX86<BitXor>();
template std::span<const KernelPath<AnyLoop>> anyX86<BitsMissing>();

}  // namespace kplib::detail
