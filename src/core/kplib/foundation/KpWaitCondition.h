#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

struct KpWaitConditionPrivate;

/// Blocks threads until another thread signals a change of data that a mutex guards. A thread may
/// wake up without a cause: check for the change in a loop. Platform failures do not throw; they
/// are written to the log.
class KPLIB_API KpWaitCondition {
public:
    KpWaitCondition();
    KpWaitCondition(const KpWaitCondition&) = delete;
    KpWaitCondition& operator=(const KpWaitCondition&) = delete;
    virtual ~KpWaitCondition();

    /// Unlocks `mutex`, which the caller must hold, waits for a signal, and locks it again.
    /// ULONG_MAX waits without a time limit. Returns false after `milliseconds`, without a log
    /// line, or if the platform fails. The deadline is on the wall clock, so a change of the
    /// system time moves it.
    bool wait(KpMutex* mutex, unsigned long milliseconds);

    /// Wakes one waiting thread, if there is one.
    void wakeOne();
    /// Wakes all waiting threads.
    void wakeAll();

private:
    KpWaitConditionPrivate* condition_;
};
