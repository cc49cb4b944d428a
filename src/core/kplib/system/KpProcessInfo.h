#pragma once

#include <kplib/foundation/KpExport.h>

/// Memory of a process, in bytes, at the time of construction. On systems without such figures, as
/// here, found() is false and all numbers are 0.
class KPLIB_API KpProcessInfo {
public:
    /// Reads the figures of the process with that id.
    explicit KpProcessInfo(long long pid);

    /// Whether there are figures.
    bool found() const { return found_; }
    /// @{
    /// A figure in bytes, 0 if unknown.
    long long workingSetSize() const { return workingSetSize_; }
    long long peakWorkingSetSize() const { return peakWorkingSetSize_; }
    long long pagefileUsage() const { return pagefileUsage_; }
    long long peakPagefileUsage() const { return peakPagefileUsage_; }
    /// @}

    /// Writes one line to the log if found().
    void log() const;

private:
    bool found_ = false;
    long long workingSetSize_ = 0, peakWorkingSetSize_ = 0, pagefileUsage_ = 0, peakPagefileUsage_ = 0;
};
