#pragma once

#include <kplib/platform/Platform.h>

namespace kplib::detail {

struct CpuCounts {
    int packages, coresPerPackage, processorsPerCore;
};

// The counts of the system's totals, each divided without a remainder. False, and `counts`
// unchanged, if the totals contradict each other.
inline bool countsOf(const platform::ProcessorCounts& totals, CpuCounts& counts)
{
    if (totals.packages < 1 || totals.physicalCores < 1 || totals.logicalProcessors < totals.physicalCores)
        return false;
    counts = {totals.packages, totals.physicalCores / totals.packages, totals.logicalProcessors / totals.physicalCores};
    return true;
}

}  // namespace kplib::detail
