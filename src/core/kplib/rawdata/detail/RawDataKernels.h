#pragma once

#include <kplib/cpu/KernelPath.h>
#include <kplib/foundation/KpPrimType.h>

#include <span>

// The loops of KpRawData. The first row of each table is the plain loop, the reference. A row
// returns its loop for a type or a width, null if it has none. Addresses need no alignment.
// Sources and targets do not overlap.

namespace kplib::detail {

// Converts `n` elements.
using ConvertLoop = void(void* dst, const void* src, long n);
using ConvertLoops = ConvertLoop*(KpPrimType to, KpPrimType from);
std::span<const KernelPath<ConvertLoops>> convertPaths();

// Converts (element + offset) * scale.
using MapLoop = void(void* dst, const void* src, long n, double offset, double scale);
using MapLoops = MapLoop*(KpPrimType to, KpPrimType from);
std::span<const KernelPath<MapLoops>> mapPaths();

// Widens the range [*min, *max], of the element type, by `n` elements, one after the other; NaN changes nothing, and
// of equal zeros the first stays.
using RangeLoop = void(const void* elements, long n, void* min, void* max);
using RangeLoops = RangeLoop*(KpPrimType type);
std::span<const KernelPath<RangeLoops>> rangePaths();

// Whether an element is less or greater than `*head`.
using DiffersLoop = bool(const void* elements, long n, const void* head);
using DiffersLoops = DiffersLoop*(KpPrimType type);
std::span<const KernelPath<DiffersLoops>> differsPaths();

// Reverses the bytes of each of `n` words of 2, 4 or 8 bytes in place.
using SwapLoop = void(void* words, long n);
using SwapLoops = SwapLoop*(int width);
std::span<const KernelPath<SwapLoops>> swapPaths();

// Copies `n` elements of 1, 2, 3, 4 or 8 bytes in reverse order.
using ReverseLoop = void(void* dst, const void* src, long n);
using ReverseLoops = ReverseLoop*(int width);
std::span<const KernelPath<ReverseLoops>> reversePaths();

}  // namespace kplib::detail
