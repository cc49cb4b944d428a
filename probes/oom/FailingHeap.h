#pragma once

#include <cstdint>

namespace kplib::probe {

/// Which allocations of the library and of the standard library's inline code fail.
struct FailurePlan {
    long from = -1;            ///< the first one, from 0; none if negative
    bool once = false;         ///< that one alone, else all from there on
    std::uint32_t chance = 0;  ///< if not 0, one of four at random, with this seed
};

/// While one exists, the plan holds for all threads. One at a time.
class FailingHeap {
public:
    explicit FailingHeap(const FailurePlan& plan);
    FailingHeap(const FailingHeap&) = delete;
    FailingHeap& operator=(const FailingHeap&) = delete;
    ~FailingHeap();

    /// Allocations so far, and those of them that failed.
    static long seen();
    static long failed();
};

}  // namespace kplib::probe
