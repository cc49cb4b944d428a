#pragma once

#include <kplib/volume/detail/MorphologyKernels.h>
#include <kplib/volume/detail/MorphologyLayout.h>
#include <kplib/volume/detail/MorphologyLoops.h>

#include <algorithm>
#include <cstring>
#include <memory>

// Plan
//
// A slice is one string of bits that starts at a word boundary. A step along y is a shift of the
// string by a row; a step along x is a shift by one bit with the ends of the rows masked. So rows
// need no alignment and all loops are long. Erosion is the dilation of the inverted mask: bits are
// inverted when a slice is read and when it is written. Bits after the last voxel are 0 in each
// slice that a stage receives, so the outside is background for dilation, foreground for erosion.
//
// A pass is a stage, and each slice goes through all stages while it is in the cache. At time t,
// stage i receives slice t - delay(i) and completes the slice `step` before it. Four slices, two
// stages of step 1 ("-" is a slice of zeros after the last one):
//
//     time                 0    1    2    3    4    5
//     read from src        0    1    2    3
//     stage 0 receives     0    1    2    3    -
//     stage 0 completes         0    1    2    3
//     stage 1 receives          0    1    2    3    -
//     stage 1 completes              0    1    2    3
//     written to dst                 0    1    2    3
//
// Slice t is read before slice t - passes is written, so dst may be src.
//
// Each neighbourhood consists of two figures in the plane: `near`, the voxels reached in the slice
// itself, and `far`, the voxels reached in the slices `step` before and after it:
//
//     Faces   near:  . o .   far:  . . .     Edges   near:  o o o   far:  . o .
//                    o o o         . o .                    o o o         o o o
//                    . o .         . . .                    o o o         . o .
//
//     Corners: near and far are both the square of Edges, with `step` instead of 1
//
//     completed(z - step) = far(z - 2 step) | near(z - step) | far(z)
//
// So a stage keeps `near` of one slice and `far` of the last 2 * step slices, in a ring indexed by
// z % (2 * step). MorphologyLayout describes the steps and the buffers.

namespace kplib::detail {

KPLIB_X86_ROWS(MorphologyLoop, morphologyX86);

namespace morphology {

using Stage = MorphologyStage;
using Layout = MorphologyLayout;

struct Passes {
    const MorphologyJob& job;
    const Layout layout{job};
    Word* const area;
    const Word flip = job.erodes ? ~Word{0} : 0;

    KPLIB_KERNEL_BODY Word* slice(long i) const { return area + layout.slice(i); }
    KPLIB_KERNEL_BODY Word* input(long stage) const { return slice(stage % 2); }
    KPLIB_KERNEL_BODY Word* between() const { return slice(2); }
    KPLIB_KERNEL_BODY Word* near(const Stage& stage) const { return slice(stage.slices); }
    KPLIB_KERNEL_BODY Word* far(const Stage& stage, long z) const
    {
        return slice(stage.slices + 1 + z % (2 * stage.step));
    }
    KPLIB_KERNEL_BODY Word* notFirst(const Stage& stage) const { return area + layout.masks + stage.masks; }
    KPLIB_KERNEL_BODY Word* notLast(const Stage& stage) const { return notFirst(stage) + layout.maskWords; }

    KPLIB_KERNEL_BODY void clear() const
    {
        std::memset(area, 0, static_cast<std::size_t>(layout.masks) * sizeof(Word));
        for (long i = 0; i < layout.count; ++i)
            makeMasks(layout.stages[i]);
    }
    // Masks of the voxels that have another voxel `step` before, or after, them in their row.
    KPLIB_KERNEL_BODY void makeMasks(const Stage& stage) const
    {
        const auto bits = static_cast<unsigned long>(layout.maskWords * wordBits);
        std::fill_n(notFirst(stage), 2 * layout.maskWords, ~Word{0});
        const auto nx = static_cast<unsigned long>(job.nx), ends = std::min(static_cast<unsigned long>(stage.step), nx);
        for (unsigned long first = 0; first < bits; first += nx)
            for (unsigned long i = 0; i < ends; ++i) {
                unset(notFirst(stage), first + i, bits);
                unset(notLast(stage), first + nx - 1 - i, bits);
            }
    }
    KPLIB_KERNEL_BODY static void unset(Word* mask, unsigned long i, unsigned long bits)
    {
        if (i < bits)
            mask[i / 64] &= ~(Word{1} << i % 64);
    }

    // Clears the bits after the last voxel.
    KPLIB_KERNEL_BODY void clearTail(Word* bits) const
    {
        const long last = layout.sliceBits / wordBits;
        if (last < layout.words)
            bits[last] &= (Word{1} << layout.sliceBits % wordBits) - 1;
        for (long i = last + 1; i < layout.words; ++i)
            bits[i] = 0;
    }

    // Reads slice z into `to`, and writes the voxels that it reaches along x to between().
    KPLIB_KERNEL_BODY void load(long z, Word* to) const
    {
        const long from = z * layout.sliceBits, used = (layout.sliceBits + wordBits - 1) / wordBits;
        long whole = std::max(used - 2, 0L) & -block;  // words whose source words all lie in the field
        if (from == 0)
            whole = 0;
        const long base = from % 32 == 0 ? from - 32 : from / 32 * 32;
        const auto* const words = reinterpret_cast<const LooseWord*>(job.src + base / 32);
        for (long i = 0; i < whole; i += layout.maskWords)
            realignAlongX(to + i, between() + i, words + i, notFirst(layout.stages[0]), notLast(layout.stages[0]),
                          std::min(whole - i, layout.maskWords), from - base, flip);
        for (long i = whole; i < used; ++i)
            to[i] = bitsAt(job.src, from + i * wordBits, std::min(layout.sliceBits - i * wordBits, wordBits)) ^ flip;
        clearTail(to);
        widen(layout.stages[0], to, whole);
    }

    // Writes the voxels that a slice reaches along x to between(), from word `start` on.
    KPLIB_KERNEL_BODY void widen(const Stage& stage, const Word* bits, long start) const
    {
        while (start < layout.words) {
            const long k = start % layout.maskWords, n = std::min(layout.words - start, layout.maskWords - k);
            alongX(between() + start, bits + start, notFirst(stage) + k, notLast(stage) + k, n, stage.step);
            start += n;
        }
    }

    // Whether slices can be written in place.
    KPLIB_KERNEL_BODY bool isInBlocks() const { return layout.sliceBits == layout.words * wordBits; }
    KPLIB_KERNEL_BODY Word* target(long z) const
    {
        return reinterpret_cast<Word*>(job.dst + z * layout.sliceBits / 32);
    }
    // Writes slice z. Its first and last words may be shared with adjacent slices.
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

    // Passes slice z to a stage, and writes the slice `step` before it, which is then complete.
    template <MorphologyReach reach>
    KPLIB_KERNEL_BODY void step(const Stage& stage, const Word* in, long z, Word* out, Word flipOut) const
    {
        const long rowBits = stage.step * job.nx;
        Word *const oldest = far(stage, z), *const middle = far(stage, z + stage.step);
        if (rowBits % wordBits == 0)
            Combine<reach, true>::run(out, near(stage), oldest, middle, in, between(), layout.words, rowBits, flipOut);
        else
            Combine<reach, false>::run(out, near(stage), oldest, middle, in, between(), layout.words, rowBits, flipOut);
    }
};

template <MorphologyReach reach>
struct AllPasses {
    KPLIB_KERNEL_BODY static void run(const MorphologyJob* job, Word* area)
    {
        const Passes passes{.job = *job, .area = area};
        passes.clear();
        for (long t = 0; t < job->nz + passes.layout.passes; ++t) {
            if (t < job->nz)
                passes.load(t, passes.input(0));
            for (long i = 0; i < passes.layout.count; ++i)
                toStage(passes, i, t - passes.layout.stages[i].delay);
        }
    }

    KPLIB_KERNEL_BODY static void toStage(const Passes& passes, long i, long z)
    {
        const Stage& stage = passes.layout.stages[i];
        const long nz = passes.job.nz, done = z - stage.step;
        if (z < 0 || done >= nz)
            return;
        Word* const in = passes.input(i);
        if (z >= nz)
            std::fill_n(in, passes.layout.words, 0);
        if (i > 0 || z >= nz)
            passes.widen(stage, in, 0);
        const bool isResult = i == passes.layout.count - 1 && done >= 0;
        if (isResult && passes.isInBlocks()) {
            passes.template step<reach>(stage, in, z, passes.target(done), passes.flip);
            return;
        }
        Word* const out = passes.input(i + 1);
        passes.template step<reach>(stage, in, z, out, 0);
        passes.clearTail(out);
        if (isResult)
            passes.store(done, out);
    }
};

template <typename Path>
void runPasses(const MorphologyJob& job, void* area)
{
    using Run = void(const MorphologyJob*, Word*);
    static constexpr Run* runs[] = {Path::template run<AllPasses<MorphologyReach::Faces>>,
                                    Path::template run<AllPasses<MorphologyReach::Edges>>,
                                    Path::template run<AllPasses<MorphologyReach::Corners>>};
    constexpr std::size_t alignment = block * sizeof(Word);
    std::size_t space = morphologyAreaBytes(job);
    runs[static_cast<int>(job.reach) - 1](&job,
                                          static_cast<Word*>(std::align(alignment, space - alignment, area, space)));
}

}  // namespace morphology
}  // namespace kplib::detail
