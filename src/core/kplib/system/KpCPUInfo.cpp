#include <kplib/system/KpCPUInfo.h>

#include <kplib/platform/Platform.h>
#include <kplib/system/detail/CpuCounts.h>

namespace {

struct FeatureBit {
    KpCPUInfo::Feature feature;
    int word, bit;
};

constexpr FeatureBit featureBits[] = {
    {KpCPUInfo::MMX, 0, 23},
    {KpCPUInfo::MMXExtensions, 2, 22},
    {KpCPUInfo::ThreeDNow, 2, 31},
    {KpCPUInfo::SSE, 0, 25},
    {KpCPUInfo::ThreeDNowExtensions, 2, 30},
    {KpCPUInfo::SSE2, 0, 26},
    {KpCPUInfo::SSE3, 1, 0},
    {KpCPUInfo::ConditionalMove, 0, 15},
    {KpCPUInfo::SSSE3, 1, 9},
    {KpCPUInfo::SSE4_1, 1, 19},
    {KpCPUInfo::SSE4_2, 1, 20},
    {KpCPUInfo::AVX, 1, 28},
};

}  // namespace

const KpCPUInfo& KpCPUInfo::instance()
{
    static const KpCPUInfo info;
    return info;
}

KpCPUInfo::KpCPUInfo()
{
    succeeded_ = initCPUInfo();
    if (hasCPUID())
        readCPUID();
}

bool KpCPUInfo::initCPUInfo()
{
    kplib::platform::ProcessorCounts totals{};
    kplib::detail::CpuCounts counts{};
    if (!kplib::platform::processorCounts(totals) || !kplib::detail::countsOf(totals, counts))
        return false;
    cpuCount_ = counts.packages;
    coreCount_ = counts.coresPerPackage;
    lpuCount_ = counts.processorsPerCore;
    return true;
}

unsigned KpCPUInfo::detectCPUFeatures() const
{
    unsigned mask = 0;
    for (const FeatureBit& f : featureBits) {
        if (features_[f.word] >> f.bit & 1)
            mask |= f.feature;
    }
    return mask;
}
