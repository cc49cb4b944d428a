#pragma once

#include <kplib/cpu/KernelPath.h>
#include KPLIB_PROCESSOR_HEADER(FlagMask)

#include <algorithm>
#include <bit>
#include <cstdint>

namespace kplib::detail {

// One bit for each voxel of a row, followed by a word of zeros.
using RowBits = std::uint64_t;

inline long wordsOf(long n)
{
    return (n + 63) / 64 + 1;
}

// 64 of `isSet(i)` from `start` on: a loop of fixed length, so that it becomes vector instructions.
template <typename IsSet>
RowBits bitsOf64(long start, IsSet isSet)
{
    alignas(64) unsigned char flags[64];
    for (long i = 0; i < 64; ++i)
        flags[i] = isSet(start + i);
    return bitsOf64Flags(flags);
}

// Writes `isSet(i)` as bits and returns whether any is set.
template <typename IsSet>
bool fillBits(RowBits* bits, long n, IsSet isSet)
{
    RowBits any = 0;
    long start = 0;
    for (; start + 64 <= n; start += 64)
        any |= bits[start / 64] = bitsOf64(start, isSet);
    if (start > 0 && start < n) {
        any |= bits[start / 64] = bitsOf64(n - 64, isSet) >> (64 - (n - start));
    } else if (start < n) {
        bits[0] = 0;
        for (long i = 0; i < n; ++i)
            bits[0] |= RowBits{isSet(i)} << i;
        any = bits[0];
    }
    bits[wordsOf(n) - 1] = 0;
    return any != 0;
}

// The first set bit from `from` on, or `end`. Unset ones are found with `flip` all ones.
inline long findBit(const RowBits* bits, long from, long end, RowBits flip = 0)
{
    if (from >= end)
        return end;
    RowBits word = (bits[from / 64] ^ flip) >> from % 64;
    if (word != 0)
        return std::min(end, from + std::countr_zero(word));
    for (long i = from / 64 + 1; i * 64 < end; ++i) {
        word = bits[i] ^ flip;
        if (word != 0)
            return std::min(end, i * 64 + std::countr_zero(word));
    }
    return end;
}

// How many bits are set in [from, end), which isn't empty.
inline long countBits(const RowBits* bits, long from, long end)
{
    const long last = (end - 1) / 64;
    const RowBits tail = ~RowBits{0} >> (63 - (end - 1) % 64);
    RowBits word = bits[from / 64] >> from % 64 << from % 64;
    long count = 0;
    for (long i = from / 64; i < last; word = bits[++i])
        count += std::popcount(word);
    return count + std::popcount(word & tail);
}

}  // namespace kplib::detail
