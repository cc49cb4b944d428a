#pragma once

#include <kplib/cpu/KernelPath.h>
#include <kplib/geometry/KpVec3i.h>
#include <kplib/volume/KpBitfield.h>

#include <cstdint>
#include <span>

namespace kplib::detail {

// Which voxels are neighbours: those with at most that sum of absolute offsets, each of them at most 1.
enum class MorphologyReach : int { Faces = 1, Edges = 2, Corners = 3 };

struct MorphologyJob {
    const std::uint32_t* src;
    std::uint32_t* dst;  // may be src
    long nx, ny, nz;
    long passes;
    MorphologyReach reach;
    bool erodes;
};

// `job.passes` passes in one go through memory; `area` is of morphologyAreaBytes(job).
using MorphologyLoop = void(const MorphologyJob& job, void* area);
std::span<const KernelPath<MorphologyLoop>> morphologyPaths();
unsigned long morphologyAreaBytes(const MorphologyJob& job);

// How many of the job's passes to do at once so that their work area stays in the cache.
long morphologyPassesAtOnce(const MorphologyJob& job);

// One pass voxel by voxel: the reference, which needs no work area.
void morphologyByVoxel(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, MorphologyReach reach, bool erodes);

}  // namespace kplib::detail
