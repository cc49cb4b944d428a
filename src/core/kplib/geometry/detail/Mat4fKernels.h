#pragma once

#include <kplib/cpu/KernelPath.h>

#include <span>

namespace kplib::detail {

// Transforms `n` points, three floats each, by the 16 floats of `matrix`, as KpMat4f::multVecMatrix() does one. `from`
// and `to` are the same or don't overlap.
using TransformLoop = void(const float* matrix, const float* from, float* to, long n);

std::span<const KernelPath<TransformLoop>> transformPaths();

// The inverse of `in`, of which the last column is (0, 0, 0, 1), into `out`, which may be the same. False, and nothing
// written, if the determinant vanishes among its terms.
using AffineInverse = bool(const float* in, float* out);

std::span<const KernelPath<AffineInverse>> affineInversePaths();

}  // namespace kplib::detail
