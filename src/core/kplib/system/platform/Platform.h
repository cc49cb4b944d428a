#pragma once

#include <cstdint>

// What the library asks of the operating system beyond plain POSIX; one source a system answers.

namespace kplib::platform {

/// Steady counter from an arbitrary start; never runs backwards. Safe from any thread.
std::uint64_t ticks();

/// Nanoseconds per tick, as a fraction.
struct TickRatio {
    std::uint32_t numerator;
    std::uint32_t denominator;
};
TickRatio tickRatio();

/// Time since 1970-01-01 00:00:00 UTC, truncated to milliseconds.
struct WallTime {
    std::int64_t seconds;
    int milliseconds;  // 0 to 999
};
WallTime wallTime();

/// The system's name, as in a build string.
const char* name();

}  // namespace kplib::platform
