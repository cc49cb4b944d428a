#include <kplib/cpu/KernelPathX86.h>
#include <kplib/system/detail/HexLoops.h>

#include <span>

namespace kplib::detail {

std::span<const KernelPath<HexLoop>> hexX86()
{
    static const KernelPath<HexLoop> paths[] = {
        {"avx2", hasAvx2(), ForAvx2::run<WriteDigits>},
        {"avx512", hasAvx512(), ForAvx512::run<WriteDigits>},
    };
    return paths;
}

}  // namespace kplib::detail
