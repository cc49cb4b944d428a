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

// Vectors of the compiler: it doesn't reorder a minimum of floats by itself. Each lane follows the sequential steps.
template <typename T, int Bytes>
struct Lanes {
    typedef T Vector __attribute__((vector_size(Bytes)));
    static constexpr int count = Bytes / sizeof(T);
    static constexpr int unroll = 4;
    static constexpr long step = unroll * count;  // elements a round
    static constexpr long block = 256 * step;     // elements between two looks at the outcome

    KPLIB_KERNEL_BODY static void load(Vector& to, const void* from) { std::memcpy(&to, from, Bytes); }
};

// Smallest and largest of a multiple of Lanes::step elements and the given range, but for the sign of zeros.
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

// The bound after a block whose smallest or largest element is `found`: the earlier one stays if they are equal, and
// of the zeros in the block the first is taken, since lanes lose their order.
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
            return;  // at the head it stays
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
