#include <kplib/rawdata/detail/KpLoose.h>
#include <kplib/volume/detail/KpMorphologyKernels.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <numeric>

// Slices pass, one after the other, through a row of stages, one a pass of the operation. A slice is one string of
// bits that starts at a word: steps along y are shifts of the string, steps along x are shifts by one with the ends of
// the rows masked. So rows need no alignment, and all loops are long. Erosion is the dilation of what is not set.
//
// Any of the neighbourhoods is made of two figures in the plane: what a voxel reaches in its own slice (near), and what
// it reaches in the slices before and behind (far). A stage keeps what the slices that have come so far contribute.

namespace kplib::detail {
namespace {

using Word [[gnu::may_alias]] = std::uint64_t;  // fields are of halves of it
using LooseWord = Loose<std::uint64_t>;
constexpr long wordBits = 64, block = 8;  // loops go by blocks, the words of a cache line
constexpr unsigned long cacheBytes = 768UL << 10;

constexpr long roundedUp(long n, long to)
{
    return (n + to - 1) / to * to;
}

/// Where things lie in the work area, in words. Each slice has zeros before and behind, for shifts by a row.
struct Layout {
    explicit constexpr Layout(const MorphologyJob& job) :
        sliceBits(job.nx * job.ny), words(roundedUp(sliceBits, wordBits * block) / wordBits),
        pad(roundedUp(job.nx / wordBits + 2, block)), maskWords(std::min(words, roundedUp(64, maskPeriod(job.nx))))
    {
    }
    /// The masks of the ends of rows repeat themselves.
    static constexpr long maskPeriod(long nx) { return std::lcm(nx, wordBits * block) / wordBits; }
    constexpr long size(long passes) const { return pad + (fixedSlices + 3 * passes) * (words + pad) + 2 * maskWords; }
    constexpr long slice(long i) const { return pad + i * (words + pad); }
    constexpr long masks(long passes) const { return slice(fixedSlices + 3 * passes); }

    static constexpr long fixedSlices = 3;  // two of input by turns, one between the steps along x and y

    long sliceBits;
    long words;
    long pad;
    long maskWords;
};

// What follows is compiled for each kind of processor.

/// `count` bits from bit `pos`, without looking at words beyond; the bits above are of no meaning.
KPLIB_KERNEL_BODY Word bitsAt(const std::uint32_t* field, long pos, long count)
{
    const std::uint32_t* word = field + pos / 32;
    Word bits = *word >> pos % 32;
    for (long have = 32 - pos % 32; have < count; have += 32)
        bits |= Word{*++word} << have;
    return bits;
}

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

/// The 64 bits that end `by` bits, 0 to 63, below the top of `high`, or start `by` above the bottom of `low`.
KPLIB_KERNEL_BODY Word shiftedUp(Word low, Word high, long by)
{
    return high << by | low >> 1 >> (63 - by);
}
KPLIB_KERNEL_BODY Word shiftedDown(Word low, Word high, long by)
{
    return low >> by | high << 1 << (63 - by);
}

/// The voxels and their neighbours along y.
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

/// The voxels and their neighbours along x.
KPLIB_KERNEL_BODY void alongX(Word* __restrict to, const Word* __restrict bits, const Word* __restrict notFirst,
                              const Word* __restrict notLast, long n)
{
    n &= -block;
    for (long i = 0; i < n; ++i)
        to[i] = bits[i] | (shiftedUp(bits[i - 1], bits[i], 1) & notFirst[i]) |
                (shiftedDown(bits[i], bits[i + 1], 1) & notLast[i]);
}

/// Both at once, for words that begin `by` bits, 1 to 62, above the bottom of those of the field.
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

/// Completes the slice before `in`, and takes up what `in` contributes: `near` and `farBefore` are those of the slice
/// before, `far` that of the one before it and then that of `in`.
template <MorphologyReach reach, bool rowsOfWords>
struct Combine {
    KPLIB_KERNEL_BODY static void run(Word* __restrict out, Word* __restrict near, Word* __restrict far,
                                      const Word* __restrict farBefore, const Word* __restrict in,
                                      const Word* __restrict wide, long n, long nx, Word flip)
    {
        const long rowWords = nx / wordBits, by = nx % wordBits;
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

struct Passes {
    const MorphologyJob& job;
    const Layout layout{job};
    Word* const area;
    const Word flip = job.erodes ? ~Word{0} : 0;

    KPLIB_KERNEL_BODY Word* slice(long i) const { return area + layout.slice(i); }
    KPLIB_KERNEL_BODY Word* input(long stage) const { return slice(stage % 2); }
    KPLIB_KERNEL_BODY Word* between() const { return slice(2); }
    KPLIB_KERNEL_BODY Word* near(long stage) const { return slice(3 + 3 * stage); }
    KPLIB_KERNEL_BODY Word* far(long stage, long z) const { return slice(4 + 3 * stage + z % 2); }

    KPLIB_KERNEL_BODY Word* notFirst() const { return area + layout.masks(job.passes); }
    KPLIB_KERNEL_BODY Word* notLast() const { return notFirst() + layout.maskWords; }

    KPLIB_KERNEL_BODY void clear() const
    {
        std::memset(area, 0, static_cast<std::size_t>(layout.masks(job.passes)) * sizeof(Word));
        std::fill_n(notFirst(), 2 * layout.maskWords, ~Word{0});
        for (long first = 0; first < layout.maskWords * wordBits; first += job.nx) {
            notFirst()[first / wordBits] &= ~(Word{1} << first % wordBits);
            const long last = first + job.nx - 1;
            if (last < layout.maskWords * wordBits)
                notLast()[last / wordBits] &= ~(Word{1} << last % wordBits);
        }
    }

    /// Zeros behind the last voxel.
    KPLIB_KERNEL_BODY void clearTail(Word* bits) const
    {
        const long last = layout.sliceBits / wordBits;
        if (last < layout.words)
            bits[last] &= (Word{1} << layout.sliceBits % wordBits) - 1;
        for (long i = last + 1; i < layout.words; ++i)
            bits[i] = 0;
    }

    /// Slice z, and what it reaches along x.
    KPLIB_KERNEL_BODY void load(long z, Word* to) const
    {
        const long from = z * layout.sliceBits, used = (layout.sliceBits + wordBits - 1) / wordBits;
        long whole = std::max(used - 2, 0L) & -block;  // whose source lies in the field
        if (from == 0)
            whole = 0;
        const long base = from % 32 == 0 ? from - 32 : from / 32 * 32;
        const auto* const words = reinterpret_cast<const LooseWord*>(job.src + base / 32);
        for (long i = 0; i < whole; i += layout.maskWords)
            realignAlongX(to + i, between() + i, words + i, notFirst(), notLast(),
                          std::min(whole - i, layout.maskWords), from - base, flip);
        for (long i = whole; i < used; ++i)
            to[i] = bitsAt(job.src, from + i * wordBits, std::min(layout.sliceBits - i * wordBits, wordBits)) ^ flip;
        clearTail(to);
        widen(to, whole);
    }

    /// What a slice reaches along x, from a word on.
    KPLIB_KERNEL_BODY void widen(const Word* bits, long start) const
    {
        while (start < layout.words) {
            const long k = start % layout.maskWords, n = std::min(layout.words - start, layout.maskWords - k);
            alongX(between() + start, bits + start, notFirst() + k, notLast() + k, n);
            start += n;
        }
    }

    /// Whether slices can be written in place.
    KPLIB_KERNEL_BODY bool isInBlocks() const { return layout.sliceBits == layout.words * wordBits; }
    KPLIB_KERNEL_BODY Word* target(long z) const
    {
        return reinterpret_cast<Word*>(job.dst + z * layout.sliceBits / 32);
    }
    /// Slices share words with the ones beside them.
    KPLIB_KERNEL_BODY void store(long z, const Word* bits) const
    {
        const long to = z * layout.sliceBits, by = to % 32, base = to - by, end = layout.sliceBits + by;
        putBits(job.dst, to, std::min(wordBits - by, layout.sliceBits), bits[0] ^ flip);
        const long whole = end / wordBits;
        unalign(reinterpret_cast<LooseWord*>(job.dst + base / 32), bits, whole, by, flip);
        if (whole > 0)
            putBits(job.dst, base + whole * wordBits, end % wordBits,
                    shiftedUp(bits[whole - 1], bits[whole], by) ^ flip);
    }

    /// A slice comes to a stage; the one before it is complete then, and goes out.
    template <MorphologyReach reach>
    KPLIB_KERNEL_BODY void step(long stage, long z, Word* out, Word flipOut) const
    {
        if (job.nx % wordBits == 0)
            Combine<reach, true>::run(out, near(stage), far(stage, z), far(stage, z + 1), input(stage), between(),
                                      layout.words, job.nx, flipOut);
        else
            Combine<reach, false>::run(out, near(stage), far(stage, z), far(stage, z + 1), input(stage), between(),
                                       layout.words, job.nx, flipOut);
    }
};

/// Slice t - s comes to stage s at time t; as it is read before one so far ahead is written, dst may be src.
template <MorphologyReach reach>
struct AllPasses {
    KPLIB_KERNEL_BODY static void run(const MorphologyJob* job, Word* area)
    {
        const Passes passes{.job = *job, .area = area};
        const long nz = job->nz;
        passes.clear();
        for (long t = 0; t < nz + job->passes; ++t) {
            if (t < nz)
                passes.load(t, passes.input(0));
            for (long stage = std::max(0L, t - nz); stage < std::min(job->passes, t + 1); ++stage)
                toStage(passes, stage, t - stage);
        }
    }

    KPLIB_KERNEL_BODY static void toStage(const Passes& passes, long stage, long z)
    {
        const bool isLast = stage == passes.job.passes - 1;
        if (z == passes.job.nz)  // behind the last slice
            std::fill_n(passes.input(stage), passes.layout.words, 0);
        if (stage > 0 || z == passes.job.nz)
            passes.widen(passes.input(stage), 0);
        if (isLast && z > 0 && passes.isInBlocks()) {
            passes.template step<reach>(stage, z, passes.target(z - 1), passes.flip);
            return;
        }
        Word* const out = passes.input(stage + 1);
        passes.template step<reach>(stage, z, out, 0);
        passes.clearTail(out);
        if (isLast && z > 0)
            passes.store(z - 1, out);
    }
};

template <typename Path, MorphologyReach reach>
void runAligned(const MorphologyJob& job, void* area)
{
    void* aligned = area;
    std::size_t space = morphologyAreaBytes(job);
    std::align(block * sizeof(Word), space - block * sizeof(Word), aligned, space);
    Path::template run<AllPasses<reach>>(&job, static_cast<Word*>(aligned));
}

template <typename Path>
MorphologyLoop* morphologyLoop(MorphologyReach reach)
{
    switch (reach) {
    case MorphologyReach::Faces:
        return runAligned<Path, MorphologyReach::Faces>;
    case MorphologyReach::Edges:
        return runAligned<Path, MorphologyReach::Edges>;
    default:
        return runAligned<Path, MorphologyReach::Corners>;
    }
}

}  // namespace

unsigned long morphologyAreaBytes(const MorphologyJob& job)
{
    return static_cast<unsigned long>(Layout(job).size(job.passes) + block) * sizeof(Word);
}

long morphologyPassesAtOnce(const MorphologyJob& job)
{
    MorphologyJob some = job;
    for (some.passes = 1; some.passes < job.passes; ++some.passes) {
        if (morphologyAreaBytes(some) > cacheBytes)
            break;
    }
    return some.passes;
}

std::span<const KernelPath<MorphologyLoops>> morphologyPaths()
{
    static const KernelPath<MorphologyLoops> paths[] = {{"plain", true, morphologyLoop<ForAny>},
                                                        {"avx2", hasAvx2(), morphologyLoop<ForAvx2>},
                                                        {"avx512", hasAvx512(), morphologyLoop<ForAvx512>}};
    return paths;
}

}  // namespace kplib::detail
