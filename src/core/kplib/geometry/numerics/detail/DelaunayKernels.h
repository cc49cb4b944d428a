#pragma once

#include <kplib/cpu/KernelPath.h>

#include <cstdint>
#include <span>

namespace kplib::detail::delaunay {

// Writes to `hits` the indices, ascending, of those of `n` circles that contain `point`, and gives their number.
// `columns`: the coordinates of the centres, an array an axis, and the squared radii.
using CircleScan = long(const double* const* columns, long n, const double* point, std::int32_t* hits);

// For the plane (Size 2) and for space (Size 3).
template <int Size>
std::span<const KernelPath<CircleScan>> circleScanPaths();

}  // namespace kplib::detail::delaunay
