#pragma once

#include <kplib/cpu/Loose.h>
#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

#include <algorithm>
#include <cmath>
#include <cstring>

namespace kplib::detail {

KPLIB_X86_ROWS(RangeLoops, rangeX86);
KPLIB_X86_ROWS(DiffersLoops, differsX86);

namespace scan {

// Plan
//
// The plain loops define the results: they go through the elements one by one, a NaN changes no
// bound, and of equal zeros (0 and -0) the first stays.
//
// The wide loops handle blocks of 256 steps. A step is four vectors, each with its own lanes of
// smallest and largest elements, so that no comparison waits for the one before it:
//
//     elements:  | v0 | v1 | v2 | v3 | v0 | v1 | v2 | v3 | ...  | rest |
//                  |    |    |    |    |    |    |    |            |
//     lanes:      [0]  [1]  [2]  [3]  [0]  [1]  [2]  [3]       plain loop
//
// After a block the lanes are reduced to one smallest and one largest element. Lanes do not keep
// the order of the elements, which matters for the sign of a zero only: settled() restores it. NaN
// fails both comparisons of a lane, as in the plain loops. The search for an element that differs
// from the first one is the same reduction; it ends after the first block with a wider range.

template <typename T>
KPLIB_KERNEL_BODY void widen(T& min, T& max, T value)
{
    if (min > value)
        min = value;
    else if (value > max)
        max = value;
}

template <typename T>
struct RangePlain {
    KPLIB_KERNEL_BODY static void run(const void* elements, long n, void* min, void* max)
    {
        auto* values = static_cast<const Loose<T>*>(elements);
        T low = *static_cast<T*>(min), high = *static_cast<T*>(max);
        for (long i = 0; i < n; ++i)
            widen(low, high, values[i].value);
        *static_cast<T*>(min) = low;
        *static_cast<T*>(max) = high;
    }
};

template <typename T>
struct DiffersPlain {
    KPLIB_KERNEL_BODY static bool run(const void* elements, long n, const void* head)
    {
        auto* values = static_cast<const Loose<T>*>(elements);
        const T first = *static_cast<const T*>(head);
        for (long i = 0; i < n; ++i) {
            if (values[i].value < first || values[i].value > first)
                return true;
        }
        return false;
    }
};

// Vector extensions, since the compiler does not reorder a minimum of floats by itself. Each lane
// takes its elements in sequence.
template <typename T, int Bytes>
struct Lanes {
    typedef T Vector __attribute__((vector_size(Bytes)));
    static constexpr int count = Bytes / sizeof(T);
    static constexpr int unroll = 4;
    static constexpr long step = unroll * count;  // elements a round
    static constexpr long block = 256 * step;     // elements between two reductions of the lanes

    KPLIB_KERNEL_BODY static void load(Vector& to, const void* from) { std::memcpy(&to, from, Bytes); }
};

// Extends the range [min, max] by `n` elements, a multiple of Lanes::step. The sign of a zero is
// unspecified.
template <typename T, int Bytes>
KPLIB_KERNEL_BODY void blockRange(const Loose<T>* values, long n, T& min, T& max)
{
    using L = Lanes<T, Bytes>;
    typename L::Vector low[L::unroll], high[L::unroll];
    for (int u = 0; u < L::unroll; ++u) {
        low[u] = min - typename L::Vector{};
        high[u] = max - typename L::Vector{};
    }
    for (long i = 0; i < n; i += L::step) {
        for (int u = 0; u < L::unroll; ++u) {
            typename L::Vector v;
            L::load(v, values + i + u * L::count);
            low[u] = v < low[u] ? v : low[u];
            high[u] = v > high[u] ? v : high[u];
        }
    }
    for (int u = 0; u < L::unroll; ++u) {
        for (int k = 0; k < L::count; ++k) {
            min = low[u][k] < min ? low[u][k] : min;
            max = high[u][k] > max ? high[u][k] : max;
        }
    }
}

// The bound after a block whose smallest or largest element is `found`. An equal earlier bound
// stays; of several zeros in the block the first one counts.
template <typename T>
KPLIB_KERNEL_BODY T settled(T bound, T found, const Loose<T>* values)
{
    if (found == bound)
        return bound;
    if (found == T(0)) {
        while (values->value != T(0))
            ++values;
        return values->value;
    }
    return found;
}

template <typename T, int Bytes>
struct RangeWide {
    KPLIB_KERNEL_BODY static void run(const void* elements, long n, void* min, void* max)
    {
        using L = Lanes<T, Bytes>;
        auto* values = static_cast<const Loose<T>*>(elements);
        T low = *static_cast<T*>(min), high = *static_cast<T*>(max);
        if (std::isnan(low))
            return;  // a first element that is NaN stays both bounds
        while (n >= L::step) {
            const long count = std::min(n - n % L::step, L::block);
            T blockLow = low, blockHigh = high;
            blockRange<T, Bytes>(values, count, blockLow, blockHigh);
            low = settled(low, blockLow, values);
            high = settled(high, blockHigh, values);
            values += count;
            n -= count;
        }
        *static_cast<T*>(min) = low;
        *static_cast<T*>(max) = high;
        RangePlain<T>::run(values, n, min, max);
    }
};

template <typename T, int Bytes>
struct DiffersWide {
    KPLIB_KERNEL_BODY static bool run(const void* elements, long n, const void* head)
    {
        using L = Lanes<T, Bytes>;
        auto* values = static_cast<const Loose<T>*>(elements);
        const T first = *static_cast<const T*>(head);
        for (long count = 0; n >= L::step; values += count, n -= count) {
            count = std::min(n - n % L::step, L::block);
            T min = first, max = first;
            blockRange<T, Bytes>(values, count, min, max);
            if (min < first || max > first)
                return true;
        }
        return DiffersPlain<T>::run(values, n, head);
    }
};

template <typename Path, template <typename> typename Body>
struct Each {
    template <typename Loop>
    static Loop* of(KpPrimType type)
    {
        Loop* loop = nullptr;
        kpVisitNumberType(type, [&]<typename T>(KpElementTag<T>) { loop = Path::template run<Body<T>>; });
        return loop;
    }
};

}  // namespace scan
}  // namespace kplib::detail
