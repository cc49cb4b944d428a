#include <kplib/cpu/KernelPathX86.h>
#include <kplib/rawdata/detail/RowToolsLoops.h>

#include <span>

namespace kplib::detail {

std::span<const KernelPath<ScaleLoop>> multiplyAndStoreX86()
{
    static const KernelPath<ScaleLoop> paths[] = {{"avx2", hasAvx2(), ForAvx2::run<MultiplyAndStore>},
                                                  {"avx512", hasAvx512(), ForAvx512::run<MultiplyAndStore>}};
    return paths;
}

std::span<const KernelPath<ScaleLoop>> multiplyAndAddX86()
{
    static const KernelPath<ScaleLoop> paths[] = {{"avx2", hasAvx2(), ForAvx2::run<MultiplyAndAdd>},
                                                  {"avx512", hasAvx512(), ForAvx512::run<MultiplyAndAdd>}};
    return paths;
}

std::span<const KernelPath<SwapRowsLoop>> swapRowsX86()
{
    static const KernelPath<SwapRowsLoop> paths[] = {{"avx2", hasAvx2(), ForAvx2::run<SwapRows>},
                                                     {"avx512", hasAvx512(), ForAvx512::run<SwapRows>}};
    return paths;
}

}  // namespace kplib::detail
