#include <kplib/system/KpProcessInfo.h>

#include <kplib/log/KpLogFile.h>
#include <kplib/platform/Platform.h>

KpProcessInfo::KpProcessInfo(long long pid)
{
    kplib::platform::ProcessMemory memory{};
    found_ = kplib::platform::processMemory(pid, memory);
    workingSetSize_ = memory.workingSet;
    peakWorkingSetSize_ = memory.peakWorkingSet;
    pagefileUsage_ = memory.pagefile;
    peakPagefileUsage_ = memory.peakPagefile;
}

void KpProcessInfo::log() const
{
    if (found_)
        getTheLogInstance().tracef(KpLogInfo, "ProcessInfo", "Working set size: %lldKb (peak %lldKb)",
                                   workingSetSize_ / 1024, peakWorkingSetSize_ / 1024);
}
