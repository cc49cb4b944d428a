#include <kplib/system/KpCPUInfo.h>

#include <cpuid.h>
#include <cstring>
#include <x86intrin.h>

namespace {

constexpr unsigned extended = 0x80000000;

}  // namespace

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
    return static_cast<unsigned>(__get_cpuid_max(0, nullptr));
}

unsigned KpCPUInfo::getMaxCPUIDExtFunc() const
{
    return static_cast<unsigned>(__get_cpuid_max(extended, nullptr));
}
