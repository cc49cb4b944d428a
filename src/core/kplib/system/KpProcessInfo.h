#pragma once

#include <kplib/foundation/KpExport.h>

/// Memory of a process as it was when this was made, in bytes. Where the system has no such figures, as here, found()
/// is false and all numbers are 0.
class KPLIB_API KpProcessInfo {
public:
    /// Asks for the process with that id.
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

    /// One line in the log, if found().
    void log() const;

private:
    bool found_ = false;
    long long workingSetSize_ = 0, peakWorkingSetSize_ = 0, pagefileUsage_ = 0, peakPagefileUsage_ = 0;
};
