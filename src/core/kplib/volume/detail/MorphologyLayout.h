#pragma once

#include <kplib/volume/detail/MorphologyKernels.h>

#include <algorithm>
#include <cstdint>
#include <numeric>

namespace kplib::detail {

using MorphologyWord [[gnu::may_alias]] = std::uint64_t;  // fields are of halves of it

// Does `step` passes at once: the slices `step` before and after contribute too.
struct MorphologyStage {
    long step;
    long delay;   // slices by which it follows the first stage
    long slices;  // number of its first buffer: one for the near figure, then 2 * step for the far ones
    long masks;   // words from the first mask to its two masks
};

// The stages, and the places of the buffers in the work area, counted in words:
//
//     pad, input 0, pad, input 1, pad, between, pad,
//     near of stage 0, pad, far 0 of stage 0, pad, ... far 2 * step - 1 of stage 0, pad,
//     the same of each further stage, masks
//
// A buffer holds one slice. The zeros of the pads are what a shift by `step` rows reads beyond it.
//
// Several passes with all 26 neighbours make a box. From a box of radius r, a step of r + 1 makes
// one of radius 2r + 1. The border of the volume does not change that, since all voxels between
// two voxels of the volume belong to the volume.
struct MorphologyLayout {
    static constexpr long wordBits = 64, block = 8;  // loops go by blocks, the words of a cache line
    static constexpr long maxStages = 32, maxStep = 8;
    static constexpr long fixedSlices = 3;  // two of input by turns, one between the steps along x and y

    explicit constexpr MorphologyLayout(const MorphologyJob& job) :
        sliceBits(job.nx * job.ny), words(roundedUp(sliceBits, wordBits * block) / wordBits),
        maskWords(std::min(words, roundedUp(64, maskPeriod(job.nx))))
    {
        const bool isBox = job.reach == MorphologyReach::Corners;
        long done = 0, slices = fixedSlices;
        for (; count < maxStages && done < job.passes; ++count) {
            const long step = isBox ? std::min({done + 1, job.passes - done, maxStep}) : 1;
            stages[count] = {step, done, slices, 2 * count * maskWords};
            slices += 1 + 2 * step;
            done += step;
            pad = std::max(pad, roundedUp(step * job.nx / wordBits + 2, block));
        }
        passes = done;
        masks = pad + slices * (words + pad);
    }
    static constexpr long roundedUp(long n, long to) { return (n + to - 1) / to * to; }
    // Words after which the masks of the ends of rows repeat.
    static constexpr long maskPeriod(long nx) { return std::lcm(nx, wordBits * block) / wordBits; }
    constexpr long slice(long i) const { return pad + i * (words + pad); }
    constexpr unsigned long bytes() const
    {
        return static_cast<unsigned long>(masks + 2 * count * maskWords + block) * sizeof(MorphologyWord);
    }

    long sliceBits;
    long words;
    long maskWords;
    long pad = 0;
    MorphologyStage stages[maxStages]{};
    long count = 0;
    long passes = 0;  // in all
    long masks = 0;
};

}  // namespace kplib::detail
