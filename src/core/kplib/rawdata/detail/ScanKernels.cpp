#include <kplib/rawdata/detail/ScanLoops.h>

#include <initializer_list>
#include <span>

namespace kplib::detail {

using namespace scan;

std::span<const KernelPath<RangeLoops>> rangePaths()
{
    static const KernelTable<RangeLoops> paths({{"plain", true, Each<ForAny, RangePlain>::of<RangeLoop>}}, rangeX86());
    return paths;
}

std::span<const KernelPath<DiffersLoops>> differsPaths()
{
    static const KernelTable<DiffersLoops> paths({{"plain", true, Each<ForAny, DiffersPlain>::of<DiffersLoop>}},
                                                 differsX86());
    return paths;
}

}  // namespace kplib::detail
