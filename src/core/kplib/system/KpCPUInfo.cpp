#include <kplib/system/KpCPUInfo.h>

#include <kplib/platform/Platform.h>
#include <kplib/system/detail/CpuCounts.h>

#include <cpuid.h>
#include <cstring>
#include <x86intrin.h>

namespace {

constexpr unsigned extended = 0x80000000;

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

void KpCPUInfo::readCPUID()
{
    unsigned a = 0, b = 0, c = 0, d = 0;
    __cpuid(0, a, b, c, d);
    const unsigned words[] = {b, d, c};
    std::memcpy(vendor_, words, 12);
    __get_cpuid(1, &a, &b, &features_[1], &features_[0]);
    __get_cpuid(extended + 1, &a, &b, &features_[3], &features_[2]);
}

bool KpCPUInfo::hasCPUID() const
{
    constexpr unsigned long long identification = 1U << 21;
    const unsigned long long flags = __readeflags();
    __writeeflags(flags ^ identification);
    const bool isToggled = ((__readeflags() ^ flags) & identification) != 0;
    __writeeflags(flags);
    return isToggled;
}

unsigned KpCPUInfo::getMaxCPUIDFunc() const
{
    return __get_cpuid_max(0, nullptr);
}

unsigned KpCPUInfo::getMaxCPUIDExtFunc() const
{
    return __get_cpuid_max(extended, nullptr);
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
