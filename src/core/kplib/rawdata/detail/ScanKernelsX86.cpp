#include <kplib/cpu/KernelPathX86.h>
#include <kplib/rawdata/detail/ScanLoops.h>

namespace kplib::detail {

using namespace scan;

namespace {

template <typename T>
using Range32 = RangeWide<T, 32>;
template <typename T>
using Range64 = RangeWide<T, 64>;
template <typename T>
using Differs32 = DiffersWide<T, 32>;
template <typename T>
using Differs64 = DiffersWide<T, 64>;

}  // namespace

std::span<const KernelPath<RangeLoops>> rangeX86()
{
    static const KernelPath<RangeLoops> paths[] = {{"avx2", hasAvx2(), Each<ForAvx2, Range32>::of<RangeLoop>},
                                                   {"avx512", hasAvx512(), Each<ForAvx512, Range64>::of<RangeLoop>}};
    return paths;
}

std::span<const KernelPath<DiffersLoops>> differsX86()
{
    static const KernelPath<DiffersLoops> paths[] = {
        {"avx2", hasAvx2(), Each<ForAvx2, Differs32>::of<DiffersLoop>},
        {"avx512", hasAvx512(), Each<ForAvx512, Differs64>::of<DiffersLoop>}};
    return paths;
}

}  // namespace kplib::detail
