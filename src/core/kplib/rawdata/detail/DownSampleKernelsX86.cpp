#include <kplib/cpu/KernelPathX86.h>
#include <kplib/rawdata/detail/DownSampleLoops.h>

#include <span>

namespace kplib::detail {

std::span<const KernelPath<BlockLoops>> blockX86()
{
    static const KernelPath<BlockLoops> paths[] = {
        {"lines/avx2", hasAvx2(), blocks::blockLoop<blocks::ByLines<ForAvx2>>}};
    return paths;
}

}  // namespace kplib::detail
