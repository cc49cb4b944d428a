#pragma once

#include <kplib/cpu/KernelPath.h>
#include <kplib/foundation/KpPrimType.h>

#include <span>

// The loops under down-sampling: each call makes one row of output voxels. The first row of a table is the plain loop.

namespace kplib::detail {

// A row of blocks of voxels and where their results go. Strides count elements.
struct BlockRow {
    const void* src;  // first element of the first block
    void* dst;
    long blocks;
    int fx, fy, fz;  // voxels of a block
    int components;  // interleaved elements of a voxel
    long rowStride, sliceStride;

    long voxels() const { return static_cast<long>(fx) * fy * fz; }
};

// How the voxels of a block become one, each component by itself.
enum class BlockRule : int { Mean, Maximum };

using BlockLoop = void(const BlockRow& row);
// The loop for elements of `type`, null if they are no numbers.
using BlockLoops = BlockLoop*(KpPrimType type, BlockRule rule);
std::span<const KernelPath<BlockLoops>> blockPaths();

}  // namespace kplib::detail
