#include <kplib/rawdata/detail/WordLoops.h>

#include <initializer_list>
#include <span>

namespace kplib::detail {

std::span<const KernelPath<SwapLoops>> swapPaths()
{
    static const KernelTable<SwapLoops> paths({{"plain", true, words::swapLoop<ForAny>}}, swapX86());
    return paths;
}

std::span<const KernelPath<ReverseLoops>> reversePaths()
{
    static const KernelTable<ReverseLoops> paths({{"plain", true, words::reverseLoop<ForAny>}}, reverseX86());
    return paths;
}

}  // namespace kplib::detail
