#include <kplib/cpu/KernelPathX86.h>
#include <kplib/rawdata/detail/WordLoops.h>

#include <span>

namespace kplib::detail {

std::span<const KernelPath<SwapLoops>> swapX86()
{
    static const KernelPath<SwapLoops> paths[] = {{"avx2", hasAvx2(), words::swapLoop<ForAvx2>}};
    return paths;
}

std::span<const KernelPath<ReverseLoops>> reverseX86()
{
    static const KernelPath<ReverseLoops> paths[] = {{"avx2", hasAvx2(), words::reverseLoop<ForAvx2>},
                                                     {"avx512", hasAvx512(), words::reverseLoop<ForAvx512>}};
    return paths;
}

}  // namespace kplib::detail
