#include <kplib/cpu/KernelPathX86.h>
#include <kplib/geometry/numerics/detail/EliminateLoop.h>

#include <span>

namespace kplib::detail {

std::span<const KernelPath<EliminateLoop>> eliminateX86()
{
    static const KernelPath<EliminateLoop> paths[] = {
        {"avx2", hasAvx2(), ForAvx2::run<Eliminate>},
        {"avx512", hasAvx512(), ForAvx512::run<Eliminate>},
    };
    return paths;
}

}  // namespace kplib::detail
