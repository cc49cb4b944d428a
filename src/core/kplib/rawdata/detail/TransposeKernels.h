#pragma once

#include <kplib/cpu/KernelPath.h>

#include <span>

namespace kplib::detail {

// Writes the transposed dense matrix: to[column * rows + row] = from[row * columns + column]. The
// two do not overlap.
using Transpose = void(const void* from, void* to, long rows, long columns);

// The loops for elements of 1, 2, 4 or 8 bytes; empty for any other size.
std::span<const KernelPath<Transpose>> transposePaths(long elementSize);

}  // namespace kplib::detail
