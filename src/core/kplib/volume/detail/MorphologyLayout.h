#pragma once

#include <kplib/volume/detail/MorphologyKernels.h>

#include <algorithm>
#include <cstdint>
#include <numeric>

namespace kplib::detail {

using MorphologyWord [[gnu::may_alias]] = std::uint64_t;  // fields are of halves of it

// Does `step` passes at once: slices that step before and behind, too, contribute.
struct MorphologyStage {
    long step;
    long delay;   // slices that have come to the first stage before one comes to this
    long slices;  // where its own begin, counted in slices: that for what is near, then 2 * step for what is far
    long masks;   // the first of its two
};

// The stages, and where things lie in the work area, in words. Each slice has zeros before and behind, for shifts by
// rows. Several passes with all 26 neighbours are a box: from a box of radius r one step of r + 1 makes that of 2r +
// 1, and where the volume cuts it off nothing is missing, as the ways to each voxel lead through the ones between.
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
    // The masks of the ends of rows repeat themselves.
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
