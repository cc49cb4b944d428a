#pragma once

#include <cstdint>

struct dirent;

// The functions of the operating system that the library needs beyond plain POSIX. One source for
// each system implements them.

namespace kplib::platform {

// Steady counter from an arbitrary start; never runs backwards. Safe from any thread.
std::uint64_t ticks();

// Nanoseconds per tick, as a fraction.
struct TickRatio {
    std::uint32_t numerator;
    std::uint32_t denominator;
};
TickRatio tickRatio();

// Time since 1970-01-01 00:00:00 UTC, truncated to milliseconds.
struct WallTime {
    std::int64_t seconds;
    int milliseconds;  // 0 to 999
};
WallTime wallTime();

// The system's name, as in a build string.
const char* name();

// The system's version; zeros if it is unknown.
struct Version {
    int major, minor, bugFix;
};
Version version();

// Counts the processors that are online. Returns false and leaves `counts` unchanged if the system
// does not report them.
struct ProcessorCounts {
    int packages, physicalCores, logicalProcessors;
};
bool processorCounts(ProcessorCounts& counts);

// Bytes of physical memory; 0 if unknown.
std::uint64_t totalMemory();
// Bytes available to processes without swapping. Returns false if unknown.
bool availableMemory(std::uint64_t& bytes);

// Memory of a process, in bytes. False where the system has no such figures.
struct ProcessMemory {
    std::int64_t workingSet, peakWorkingSet, pagefile, peakPagefile;
};
bool processMemory(std::int64_t process, ProcessMemory& memory);

// Names the calling thread for the system's tools; the name is cut where the system has no room for more.
void setThreadName(const char* name);

// This system's suffix of shared objects, in place of ".so".
const char* sharedObjectSuffix();

// Whether an entry of the folder that is open at a descriptor is a folder itself; a link to one is not.
bool isFolder(int folder, const dirent& entry);

}  // namespace kplib::platform
