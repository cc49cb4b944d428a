#pragma once

#include <kplib/rawdata/detail/KpFlagBits.h>

#include <algorithm>
#include <bit>
#include <cstdint>

namespace kplib::detail {

/// A bit a voxel of a row, with a word of zeros behind.
using RowBits = std::uint64_t;

inline long wordsOf(long n)
{
    return (n + 63) / 64 + 1;
}

/// The bits of `isSet(i)`; tells whether there is any.
template <typename IsSet>
bool fillBits(RowBits* bits, long n, IsSet isSet)
{
    RowBits any = 0;
    alignas(64) unsigned char flags[64];
    for (long start = 0; start < n; start += 64) {
        const long count = std::min(64L, n - start);
        if (count == 64) {
            for (long i = 0; i < 64; ++i)  // of fixed length, so that it becomes vector instructions
                flags[i] = isSet(start + i);
        } else {
            for (long i = 0; i < count; ++i)
                flags[i] = isSet(start + i);
        }
        any |= bits[start / 64] = bitsOfFlags(flags, count);
    }
    bits[wordsOf(n) - 1] = 0;
    return any != 0;
}

/// The first set bit from `from` on, or `end`. Unset ones are found with `flip` all ones.
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

/// How many bits are set in [from, end), which isn't empty.
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
