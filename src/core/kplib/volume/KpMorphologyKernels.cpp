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

using Word = std::uint64_t;
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
    constexpr long size(long passes) const { return pad + (fixedSlices + 2 * passes) * (words + pad) + 2 * maskWords; }
    constexpr long slice(long i) const { return pad + i * (words + pad); }
    constexpr long masks(long passes) const { return slice(fixedSlices + 2 * passes); }

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

struct Passes {
    const MorphologyJob& job;
    const Layout layout{job};
    Word* const area;
    const Word flip = job.erodes ? ~Word{0} : 0;

    KPLIB_KERNEL_BODY Word* slice(long i) const { return area + layout.slice(i); }
    KPLIB_KERNEL_BODY Word* input(long stage) const { return slice(stage % 2); }
    KPLIB_KERNEL_BODY Word* between() const { return slice(2); }
    KPLIB_KERNEL_BODY Word* pending(long stage) const { return slice(3 + 2 * stage); }
    KPLIB_KERNEL_BODY Word* farBefore(long stage) const { return slice(4 + 2 * stage); }

    KPLIB_KERNEL_BODY void clear() const
    {
        std::memset(area, 0, static_cast<std::size_t>(layout.masks(job.passes)) * sizeof(Word));
        Word* const notFirst = area + layout.masks(job.passes);
        Word* const notLast = notFirst + layout.maskWords;
        std::fill_n(notFirst, 2 * layout.maskWords, ~Word{0});
        for (long first = 0; first < layout.maskWords * wordBits; first += job.nx) {
            notFirst[first / wordBits] &= ~(Word{1} << first % wordBits);
            const long last = first + job.nx - 1;
            if (last < layout.maskWords * wordBits)
                notLast[last / wordBits] &= ~(Word{1} << last % wordBits);
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

    KPLIB_KERNEL_BODY void load(long z, Word* __restrict to) const
    {
        const long from = z * layout.sliceBits, by = from % 32;
        const auto* words = reinterpret_cast<const Loose<Word>*>(job.src + from / 32);
        const long used = (layout.sliceBits + wordBits - 1) / wordBits, whole = used - 2;  // those lie in the field
        for (long i = 0; i < whole; ++i)
            to[i] = shiftedDown(words[i], words[i + 1], by) ^ flip;
        for (long i = std::max(whole, 0L); i < used; ++i)
            to[i] = bitsAt(job.src, from + i * wordBits, std::min(layout.sliceBits - i * wordBits, wordBits)) ^ flip;
        clearTail(to);
    }

    /// Slices share words with the ones beside them.
    KPLIB_KERNEL_BODY void store(long z, const Word* __restrict bits) const
    {
        const long to = z * layout.sliceBits, by = to % 32, base = to - by, end = layout.sliceBits + by;
        putBits(job.dst, to, std::min(wordBits - by, layout.sliceBits), bits[0] ^ flip);
        auto* __restrict words = reinterpret_cast<Loose<Word>*>(job.dst + base / 32);
        const long whole = end / wordBits;
        for (long i = 1; i < whole; ++i)
            words[i].value = shiftedUp(bits[i - 1], bits[i], by) ^ flip;
        if (whole > 0)
            putBits(job.dst, base + whole * wordBits, end % wordBits,
                    shiftedUp(bits[whole - 1], bits[whole], by) ^ flip);
    }

    /// The voxel and its neighbours along x.
    KPLIB_KERNEL_BODY static Word alongX(const Word* bits, Word notFirst, Word notLast)
    {
        return bits[0] | (shiftedUp(bits[-1], bits[0], 1) & notFirst) | (shiftedDown(bits[0], bits[1], 1) & notLast);
    }
    /// The neighbours along y.
    KPLIB_KERNEL_BODY static Word alongY(const Word* bits, long words, long by)
    {
        return shiftedUp(bits[-words - 1], bits[-words], by) | shiftedDown(bits[words], bits[words + 1], by);
    }

    /// A slice comes to a stage; the one before it is complete then, and goes out.
    template <MorphologyReach reach>
    KPLIB_KERNEL_BODY void step(long stage) const
    {
        const long rowWords = job.nx / wordBits, rowBits = job.nx % wordBits, n = layout.words;
        const Word* __restrict in = input(stage);
        Word* __restrict out = input(stage + 1);
        Word* __restrict wide = between();
        Word* __restrict kept = pending(stage);
        Word* __restrict before = farBefore(stage);
        const Word* __restrict notFirst = area + layout.masks(job.passes);
        const Word* __restrict notLast = notFirst + layout.maskWords;
        for (long start = 0; start < n; start += layout.maskWords)
            for (long i = start, k = 0; i < std::min(n, start + layout.maskWords); ++i, ++k)
                wide[i] = alongX(in + i, notFirst[k], notLast[k]);
        for (long i = 0; i < n; ++i) {
            Word near, far;
            if constexpr (reach == MorphologyReach::Faces) {
                near = wide[i] | alongY(in + i, rowWords, rowBits);
                far = in[i];
            } else {
                near = wide[i] | alongY(wide + i, rowWords, rowBits);
                far = near;
                if constexpr (reach == MorphologyReach::Edges)
                    far = wide[i] | alongY(in + i, rowWords, rowBits);
            }
            out[i] = kept[i] | far;
            kept[i] = near | before[i];
            before[i] = far;
        }
        clearTail(out);
    }

    /// Behind the last slice nothing comes.
    KPLIB_KERNEL_BODY void finish(long stage) const
    {
        Word* const out = input(stage + 1);
        std::copy_n(pending(stage), layout.words, out);
        clearTail(out);
    }
};

/// Slice t - s comes to stage s at time t; as it is read before one so far ahead is written, dst may be src.
template <MorphologyReach reach>
struct AllPasses {
    KPLIB_KERNEL_BODY static void run(const MorphologyJob* job, Word* area)
    {
        const Passes passes{.job = *job, .area = area};
        const long stages = job->passes, nz = job->nz;
        passes.clear();
        for (long t = 0; t < nz + stages; ++t) {
            if (t < nz)
                passes.load(t, passes.input(0));
            for (long stage = std::max(0L, t - nz); stage < std::min(stages, t + 1); ++stage) {
                if (t - stage < nz)
                    passes.step<reach>(stage);
                else
                    passes.finish(stage);
            }
            if (t >= stages)
                passes.store(t - stages, passes.input(stages));
        }
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
