#pragma once

#include <kplib/cpu/KernelPath.h>

#include <span>

namespace kplib::detail {

using ScaleLoop = void(const float* src, float factor, long long n, float* dst);
std::span<const KernelPath<ScaleLoop>> multiplyAndStorePaths();
std::span<const KernelPath<ScaleLoop>> multiplyAndAddPaths();

// Exchanges `n` bytes of two rows that don't overlap.
using SwapRowsLoop = void(char* a, char* b, long n);
std::span<const KernelPath<SwapRowsLoop>> swapRowsPaths();

}  // namespace kplib::detail
