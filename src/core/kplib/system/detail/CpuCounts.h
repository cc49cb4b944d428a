#pragma once

#include <kplib/platform/Platform.h>

namespace kplib::detail {

struct CpuCounts {
    int packages, coresPerPackage, processorsPerCore;
};

// What the system's totals come to, each divided without a rest; false, and `counts` as it was, if they contradict
// each other.
inline bool countsOf(const platform::ProcessorCounts& totals, CpuCounts& counts)
{
    if (totals.packages < 1 || totals.physicalCores < 1 || totals.logicalProcessors < totals.physicalCores)
        return false;
    counts = {totals.packages, totals.physicalCores / totals.packages, totals.logicalProcessors / totals.physicalCores};
    return true;
}

}  // namespace kplib::detail
