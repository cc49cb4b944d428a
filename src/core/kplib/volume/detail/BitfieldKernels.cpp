#include <kplib/volume/detail/BitfieldKernels.h>

#include <bit>
#include <cstring>
#include <immintrin.h>
#include <iterator>
#include <numeric>

namespace kplib::detail {
namespace {

/// Words that are gone through between two looks at the outcome.
constexpr unsigned long block = 128;

unsigned long countPlain(const BitWord* words, unsigned long n)
{
    unsigned long count = 0;
    for (unsigned long i = 0; i < n; ++i)
        count += static_cast<unsigned long>(std::popcount(words[i]));
    return count;
}

// By hand: without its instruction the compiler counts a word in some twelve steps.
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

struct FindFirstPlain {
    KPLIB_KERNEL_BODY static unsigned long run(const BitWord* words, unsigned long n, BitWord skipped)
    {
        unsigned long i = 0;
        while (i < n && words[i] == skipped)
            ++i;
        return i;
    }
};

struct FindLastPlain {
    KPLIB_KERNEL_BODY static unsigned long run(const BitWord* words, unsigned long n, BitWord skipped)
    {
        for (unsigned long i = n; i > 0; --i) {
            if (words[i - 1] != skipped)
                return i - 1;
        }
        return n;
    }
};

KPLIB_KERNEL_BODY bool isBlockOf(const BitWord* words, BitWord skipped)
{
    BitWord different = 0;
    for (unsigned long k = 0; k < block; ++k)
        different |= words[k] ^ skipped;
    return different == 0;
}

struct FindFirstByBlocks {
    KPLIB_KERNEL_BODY static unsigned long run(const BitWord* words, unsigned long n, BitWord skipped)
    {
        unsigned long i = 0;
        while (i + block <= n && isBlockOf(words + i, skipped))
            i += block;
        return i + FindFirstPlain::run(words + i, n - i, skipped);
    }
};

struct FindLastByBlocks {
    KPLIB_KERNEL_BODY static unsigned long run(const BitWord* words, unsigned long n, BitWord skipped)
    {
        unsigned long end = n;
        while (end >= block && isBlockOf(words + end - block, skipped))
            end -= block;
        const unsigned long found = FindLastPlain::run(words, end, skipped);
        return found < end ? found : n;
    }
};

template <typename Op>
struct Combine {
    KPLIB_KERNEL_BODY static void run(BitWord* a, const BitWord* b, unsigned long n)
    {
        for (unsigned long i = 0; i < n; ++i)
            a[i] = Op::of(a[i], b[i]);
    }
};

template <typename Op>
struct AnyPlain {
    KPLIB_KERNEL_BODY static bool run(const BitWord* a, const BitWord* b, unsigned long n)
    {
        for (unsigned long i = 0; i < n; ++i) {
            if (Op::of(a[i], b[i]) != 0)
                return true;
        }
        return false;
    }
};

template <typename Op>
struct AnyByBlocks {
    KPLIB_KERNEL_BODY static bool run(const BitWord* a, const BitWord* b, unsigned long n)
    {
        for (; n >= block; n -= block, a += block, b += block) {
            BitWord found = 0;
            for (unsigned long k = 0; k < block; ++k)
                found |= Op::of(a[k], b[k]);
            if (found != 0)
                return true;
        }
        return AnyPlain<Op>::run(a, b, n);
    }
};

}  // namespace

std::span<const KernelPath<CountLoop>> countPaths()
{
    static const KernelPath<CountLoop> paths[] = {
        {"plain", true, countPlain},
        {"popcnt", static_cast<bool>(__builtin_cpu_supports("popcnt")), countPopcnt},
        {"avx512", __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512vpopcntdq"), countAvx512}};
    return paths;
}

std::span<const KernelPath<FindLoop>> findFirstPaths()
{
    static const KernelPath<FindLoop> paths[] = {{"plain", true, ForAny::run<FindFirstPlain>},
                                                 {"sse2", true, ForAny::run<FindFirstByBlocks>},
                                                 {"avx2", hasAvx2(), ForAvx2::run<FindFirstByBlocks>},
                                                 {"avx512", hasAvx512(), ForAvx512::run<FindFirstByBlocks>}};
    return paths;
}

std::span<const KernelPath<FindLoop>> findLastPaths()
{
    static const KernelPath<FindLoop> paths[] = {{"plain", true, ForAny::run<FindLastPlain>},
                                                 {"sse2", true, ForAny::run<FindLastByBlocks>},
                                                 {"avx2", hasAvx2(), ForAvx2::run<FindLastByBlocks>}};
    return paths;
}

template <typename Op>
std::span<const KernelPath<CombineLoop>> combinePaths()
{
    static const KernelPath<CombineLoop> paths[] = {{"plain", true, ForAny::run<Combine<Op>>},
                                                    {"avx2", hasAvx2(), ForAvx2::run<Combine<Op>>}};
    return paths;
}
template std::span<const KernelPath<CombineLoop>> combinePaths<BitAnd>();
template std::span<const KernelPath<CombineLoop>> combinePaths<BitOr>();
template std::span<const KernelPath<CombineLoop>> combinePaths<BitXor>();

template <typename Op>
std::span<const KernelPath<AnyLoop>> anyPaths()
{
    static const KernelPath<AnyLoop> paths[] = {{"plain", true, ForAny::run<AnyPlain<Op>>},
                                                {"sse2", true, ForAny::run<AnyByBlocks<Op>>},
                                                {"avx2", hasAvx2(), ForAvx2::run<AnyByBlocks<Op>>},
                                                {"avx512", hasAvx512(), ForAvx512::run<AnyByBlocks<Op>>}};
    return paths;
}
template std::span<const KernelPath<AnyLoop>> anyPaths<BitAnd>();
template std::span<const KernelPath<AnyLoop>> anyPaths<BitXor>();
template std::span<const KernelPath<AnyLoop>> anyPaths<BitsMissing>();

}  // namespace kplib::detail
