#pragma once

#include <kplib/cpu/Loose.h>
#include <kplib/volume/detail/MorphologyLayout.h>

#include <algorithm>
#include <cstdint>

// The inner loops of morphology on strings of bits, compiled for each kind of processor.
namespace kplib::detail::morphology {

using Word = MorphologyWord;
using LooseWord = Loose<std::uint64_t>;
constexpr long wordBits = MorphologyLayout::wordBits, block = MorphologyLayout::block;

// The `count` bits from bit `pos`; reads no further words. The bits above them are unspecified.
KPLIB_KERNEL_BODY Word bitsAt(const std::uint32_t* field, long pos, long count)
{
    const std::uint32_t* word = field + pos / 32;
    Word bits = *word >> pos % 32;
    for (long have = 32 - pos % 32; have < count; have += 32)
        bits |= Word{*++word} << have;
    return bits;
}

// Writes the lowest `count` bits to the bits from `pos` on; the others stay.
KPLIB_KERNEL_BODY void putBits(std::uint32_t* field, long pos, long count, Word bits)
{
    while (count > 0) {
        const long at = pos % 32, taken = std::min(32 - at, count);
        const std::uint32_t mask = ~0U >> (32 - taken) << at;
        std::uint32_t& word = field[pos / 32];
        word = (word & ~mask) | (static_cast<std::uint32_t>(bits << at) & mask);
        bits >>= taken;
        pos += taken;
        count -= taken;
    }
}

// The 64 bits that end `by` bits, 0 to 63, below the top of `high`, or start `by` above the bottom of `low`.
KPLIB_KERNEL_BODY Word shiftedUp(Word low, Word high, long by)
{
    return high << by | low >> 1 >> (63 - by);
}
KPLIB_KERNEL_BODY Word shiftedDown(Word low, Word high, long by)
{
    return low >> by | high << 1 << (63 - by);
}

// The voxels before and after along y: at a distance of `words` words and `by` bits.
template <bool rowsOfWords>
KPLIB_KERNEL_BODY Word alongY(const Word* bits, long words, long by)
{
    if constexpr (rowsOfWords)
        return bits[-words] | bits[words];
    return shiftedUp(bits[-words - 1], bits[-words], by) | shiftedDown(bits[words], bits[words + 1], by);
}

// Loops. `n` is a number of whole blocks if it is that of a slice.

KPLIB_KERNEL_BODY void unalign(LooseWord* __restrict to, const Word* __restrict from, long n, long by, Word flip)
{
    for (long i = 1; i < n; ++i)
        to[i].value = shiftedUp(from[i - 1], from[i], by) ^ flip;
}

// The voxels and those `step` beside them along x.
KPLIB_KERNEL_BODY void alongX(Word* __restrict to, const Word* __restrict bits, const Word* __restrict notFirst,
                              const Word* __restrict notLast, long n, long step)
{
    n &= -block;
    for (long i = 0; i < n; ++i)
        to[i] = bits[i] | (shiftedUp(bits[i - 1], bits[i], step) & notFirst[i]) |
                (shiftedDown(bits[i], bits[i + 1], step) & notLast[i]);
}

// Both at once, for words that begin `by` bits, 1 to 62, above the bottom of those of the field.
KPLIB_KERNEL_BODY void realignAlongX(Word* __restrict to, Word* __restrict wide, const LooseWord* __restrict from,
                                     const Word* __restrict notFirst, const Word* __restrict notLast, long n, long by,
                                     Word flip)
{
    n &= -block;
    for (long i = 0; i < n; ++i) {
        const Word low = from[i] ^ flip, high = from[i + 1] ^ flip, bits = shiftedDown(low, high, by);
        to[i] = bits;
        wide[i] = bits | (shiftedDown(low, high, by - 1) & notFirst[i]) | (shiftedDown(low, high, by + 1) & notLast[i]);
    }
}

// Completes the slice one step before `in`, and stores the figures of `in`. `near` and `farBefore`
// are the figures of that slice. `far` is the figure of the slice two steps before `in`, and
// receives that of `in`.
template <MorphologyReach reach, bool rowsOfWords>
struct Combine {
    KPLIB_KERNEL_BODY static void run(Word* __restrict out, Word* __restrict near, Word* __restrict far,
                                      const Word* __restrict farBefore, const Word* __restrict in,
                                      const Word* __restrict wide, long n, long rowBits, Word flip)
    {
        const long rowWords = rowBits / wordBits, by = rowBits % wordBits;
        n &= -block;
        for (long i = 0; i < n; ++i) {
            if constexpr (reach == MorphologyReach::Corners) {
                const Word reached = wide[i] | alongY<rowsOfWords>(wide + i, rowWords, by);
                out[i] = (far[i] | farBefore[i] | reached) ^ flip;
                far[i] = reached;
            } else if constexpr (reach == MorphologyReach::Edges) {
                const Word reached = wide[i] | alongY<rowsOfWords>(in + i, rowWords, by);
                out[i] = (far[i] | near[i] | reached) ^ flip;
                near[i] = wide[i] | alongY<rowsOfWords>(wide + i, rowWords, by);
                far[i] = reached;
            } else {
                out[i] = (far[i] | near[i] | in[i]) ^ flip;
                near[i] = wide[i] | alongY<rowsOfWords>(in + i, rowWords, by);
                far[i] = in[i];
            }
        }
    }
};

}  // namespace kplib::detail::morphology
