#include <kplib/cpu/KernelPathX86.h>
#include <kplib/volume/detail/MorphologyPasses.h>

#include <span>

namespace kplib::detail {

std::span<const KernelPath<MorphologyLoop>> morphologyX86()
{
    static const KernelPath<MorphologyLoop> paths[] = {{"avx2", hasAvx2(), morphology::runPasses<ForAvx2>},
                                                       {"avx512", hasAvx512(), morphology::runPasses<ForAvx512>}};
    return paths;
}

}  // namespace kplib::detail
