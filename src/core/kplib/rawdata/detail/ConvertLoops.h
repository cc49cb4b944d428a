#pragma once

#include <kplib/cpu/ElementConvert.h>
#include <kplib/cpu/Loose.h>
#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

namespace kplib::detail {

KPLIB_X86_ROWS(ConvertLoops, convertX86);
KPLIB_X86_ROWS(MapLoops, mapX86);

namespace convert {

// A conversion and a linear map are one loop over a function of each element.

template <typename Number>
struct Unmapped {
    using Real = Number;
    KPLIB_KERNEL_BODY Real operator()(Real value) const { return value; }
};

// Sum and product are rounded each by itself.
template <typename Number>
struct Linear {
    using Real = Number;
    Real offset, scale;

    Linear(double o, double s) : offset(static_cast<Real>(o)), scale(static_cast<Real>(s)) {}
    KPLIB_KERNEL_BODY Real operator()(Real value) const { return (value + offset) * scale; }
};

template <typename To, typename From, typename Map>
struct EachElement {
    KPLIB_KERNEL_BODY static void run(void* dst, const void* src, long n, Map map)
    {
        auto* __restrict to = static_cast<Loose<To>*>(dst);
        auto* __restrict from = static_cast<const Loose<From>*>(src);
        for (long i = 0; i < n; ++i)
            to[i].value = converted<To>(map(static_cast<typename Map::Real>(from[i].value)));
    }
};

// The rows of one kind of processor. Others have an each() of their own.
template <typename Path>
struct Rows {
    template <typename To, typename From, typename Map>
    static void each(void* dst, const void* src, long n, Map map)
    {
        Path::template run<EachElement<To, From, Map>>(dst, src, n, map);
    }
};

template <typename Each, typename To, typename From>
void elements(void* dst, const void* src, long n)
{
    Each::template each<To, From>(dst, src, n, Unmapped<From>{});
}

template <typename Each, typename To, typename From>
void mapLinear(void* dst, const void* src, long n, double offset, double scale)
{
    Each::template each<To, From>(dst, src, n, Linear<MapReal<To, From>>(offset, scale));
}

template <typename Work>
void visitPair(KpPrimType to, KpPrimType from, Work&& work)
{
    kpVisitNumberType(to, [&](auto target) { kpVisitNumberType(from, [&](auto source) { work(target, source); }); });
}

template <typename Each>
ConvertLoop* convertLoop(KpPrimType to, KpPrimType from)
{
    ConvertLoop* loop = nullptr;
    visitPair(to, from, [&]<typename To, typename From>(KpElementTag<To>, KpElementTag<From>) {
        loop = elements<Each, To, From>;
    });
    return loop;
}

template <typename Each>
MapLoop* mapLoop(KpPrimType to, KpPrimType from)
{
    MapLoop* loop = nullptr;
    visitPair(to, from, [&]<typename To, typename From>(KpElementTag<To>, KpElementTag<From>) {
        loop = mapLinear<Each, To, From>;
    });
    return loop;
}

}  // namespace convert
}  // namespace kplib::detail
