#pragma once

#include <functional>

namespace kplib::probe {

/// What a child process leaves to its parent, in memory that both share.
struct Findings {
    long allocations, runs, reported, harmless, silent, partial;
    char doing[80];     ///< the run under way
    char problem[200];  ///< the first one, with the run; empty without one

    void fail(const char* what);
};

/// Memory of this process and its children; null if there is none.
Findings* sharedFindings();

/// Runs `work` in a process of its own, which `seconds` end. A crash, a hang or an early end is a problem too.
void runInChild(Findings& findings, unsigned seconds, const std::function<void()>& work);

}  // namespace kplib::probe
