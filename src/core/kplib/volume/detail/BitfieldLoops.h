#pragma once

#include <kplib/volume/detail/BitfieldKernels.h>

#include <bit>

namespace kplib::detail {

KPLIB_X86_ROWS(CountLoop, countX86);
KPLIB_X86_ROWS(FindLoop, findFirstX86);
KPLIB_X86_ROWS(FindLoop, findLastX86);
template <typename Op>
KPLIB_X86_ROWS(CombineLoop, combineX86);
template <typename Op>
KPLIB_X86_ROWS(AnyLoop, anyX86);

namespace bits {

// Words between two tests of the result.
constexpr unsigned long block = 128;

inline unsigned long countPlain(const BitWord* words, unsigned long n)
{
    unsigned long count = 0;
    for (unsigned long i = 0; i < n; ++i)
        count += static_cast<unsigned long>(std::popcount(words[i]));
    return count;
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

}  // namespace bits
}  // namespace kplib::detail
