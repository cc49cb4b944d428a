#pragma once

#include <csignal>
#include <unistd.h>

namespace kplib::test {

/// While one lives, a signal a millisecond that interrupts the calls of this thread.
struct SteadySignal {
    SteadySignal()
    {
        struct sigaction action {};
        action.sa_handler = [](int) {};
        sigaction(SIGALRM, &action, nullptr);
        ualarm(1000, 1000);
    }
    ~SteadySignal() { ualarm(0, 0); }
    /// To be called by other threads, before they begin.
    static void block()
    {
        sigset_t set;
        sigemptyset(&set);
        sigaddset(&set, SIGALRM);
        pthread_sigmask(SIG_BLOCK, &set, nullptr);
    }
};

}  // namespace kplib::test
