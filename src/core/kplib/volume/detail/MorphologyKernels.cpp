#include <kplib/volume/detail/MorphologyKernels.h>

#include <kplib/volume/detail/MorphologyPasses.h>

#include <initializer_list>

namespace kplib::detail {

using namespace morphology;

namespace {

constexpr unsigned long cacheBytes = 768UL << 10;  // most of the second cache

}  // namespace

unsigned long morphologyAreaBytes(const MorphologyJob& job)
{
    return Layout(job).bytes();
}

long morphologyPassesAtOnce(const MorphologyJob& job)
{
    MorphologyJob some = job;
    long fitting = 1;
    for (some.passes = 2; some.passes <= job.passes; ++some.passes) {
        const Layout layout(some);
        if (layout.passes < some.passes || layout.bytes() > cacheBytes)
            break;
        fitting = some.passes;
    }
    return fitting;
}

std::span<const KernelPath<MorphologyLoop>> morphologyPaths()
{
    static const KernelTable<MorphologyLoop> paths({{"plain", true, runPasses<ForAny>}}, morphologyX86());
    return paths;
}

}  // namespace kplib::detail
