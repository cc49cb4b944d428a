#include <kplib/rawdata/detail/DownSampleLoops.h>

#include <initializer_list>
#include <span>

namespace kplib::detail {

using namespace blocks;

std::span<const KernelPath<BlockLoops>> blockPaths()
{
    static const KernelTable<BlockLoops> paths(
        {{"plain", true, blockLoop<Plain>}, {"lines", true, blockLoop<ByLines<ForAny>>}}, blockX86());
    return paths;
}

}  // namespace kplib::detail
