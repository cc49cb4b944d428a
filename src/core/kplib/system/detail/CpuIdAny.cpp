#include <kplib/system/KpCPUInfo.h>

// Processors without the instruction have no vendor and no features.

void KpCPUInfo::readCPUID() {}

bool KpCPUInfo::hasCPUID() const
{
    return false;
}

unsigned KpCPUInfo::getMaxCPUIDFunc() const
{
    return 0;
}

unsigned KpCPUInfo::getMaxCPUIDExtFunc() const
{
    return 0;
}
