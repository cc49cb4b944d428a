#pragma once

#include <atomic>

namespace kplib::test {

/// Unless 0: where the random delays start that threads then make before they take a mutex, wait or signal.
extern std::atomic<unsigned> scheduleSeed;

/// While set, the platform has no thread to give.
extern std::atomic<bool> noNewThreads;

}  // namespace kplib::test
