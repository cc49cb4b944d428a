#pragma once

#include <kplib/cpu/KernelPath.h>
#include <kplib/volume/KpBitfield.h>

#include <cstdint>
#include <span>

namespace kplib::detail {

using BitWord = std::uint32_t;

struct BitAnd {
    template <typename T>
    KPLIB_KERNEL_BODY static T of(T a, T b)
    {
        return a & b;
    }
};
struct BitOr {
    template <typename T>
    KPLIB_KERNEL_BODY static T of(T a, T b)
    {
        return a | b;
    }
};
struct BitXor {
    template <typename T>
    KPLIB_KERNEL_BODY static T of(T a, T b)
    {
        return a ^ b;
    }
};
// Bits of b that a lacks.
struct BitsMissing {
    template <typename T>
    KPLIB_KERNEL_BODY static T of(T a, T b)
    {
        return b & ~a;
    }
};

// Number of set bits.
using CountLoop = unsigned long(const BitWord* words, unsigned long n);
std::span<const KernelPath<CountLoop>> countPaths();

// Index of the first, or last, word that isn't `skipped`; `n` if there is none.
using FindLoop = unsigned long(const BitWord* words, unsigned long n, BitWord skipped);
std::span<const KernelPath<FindLoop>> findFirstPaths();
std::span<const KernelPath<FindLoop>> findLastPaths();

// a = Op::of(a, b); for BitAnd, BitOr and BitXor.
using CombineLoop = void(BitWord* a, const BitWord* b, unsigned long n);
template <typename Op>
std::span<const KernelPath<CombineLoop>> combinePaths();

// Whether Op::of(a, b) has a bit anywhere; for BitAnd, BitXor and BitsMissing.
using AnyLoop = bool(const BitWord* a, const BitWord* b, unsigned long n);
template <typename Op>
std::span<const KernelPath<AnyLoop>> anyPaths();

// Writes all n / 32 + 1 words of the mask of `n` labels, as KpBitfield::fromLabels() describes.
using FromLabelsLoop = void(BitWord* words, const unsigned char* labels, unsigned long n, unsigned char label);
std::span<const KernelPath<FromLabelsLoop>> fromLabelsPaths();

// Merges `n` bits into labels, as KpBitfield::InsertPolicy describes.
using ToLabelsLoop = void(const BitWord* words, unsigned char* labels, unsigned long n, unsigned char label);
using ToLabelsLoops = ToLabelsLoop*(KpBitfield::InsertPolicy policy);  // null for an unknown policy
std::span<const KernelPath<ToLabelsLoops>> toLabelsPaths();

}  // namespace kplib::detail
