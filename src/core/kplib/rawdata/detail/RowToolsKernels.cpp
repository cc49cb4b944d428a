#include <kplib/rawdata/detail/RowToolsKernels.h>

#include <kplib/rawdata/detail/RowToolsLoops.h>

#include <initializer_list>

namespace kplib::detail {

std::span<const KernelPath<ScaleLoop>> multiplyAndStorePaths()
{
    static const KernelTable<ScaleLoop> paths({{"plain", true, ForAny::run<MultiplyAndStore>}}, multiplyAndStoreX86());
    return paths;
}

std::span<const KernelPath<ScaleLoop>> multiplyAndAddPaths()
{
    static const KernelTable<ScaleLoop> paths({{"plain", true, ForAny::run<MultiplyAndAdd>}}, multiplyAndAddX86());
    return paths;
}

std::span<const KernelPath<SwapRowsLoop>> swapRowsPaths()
{
    static const KernelTable<SwapRowsLoop> paths({{"plain", true, ForAny::run<SwapRows>}}, swapRowsX86());
    return paths;
}

}  // namespace kplib::detail
