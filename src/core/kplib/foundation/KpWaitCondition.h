#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

struct KpWaitConditionPrivate;

/// Where threads wait for a change that a mutex guards. Threads may wake up without a cause, so the caller asks for the
/// change itself in a loop. Failures of the platform don't throw: they are written to the log.
class KPLIB_API KpWaitCondition {
public:
    KpWaitCondition();
    KpWaitCondition(const KpWaitCondition&) = delete;
    KpWaitCondition& operator=(const KpWaitCondition&) = delete;
    virtual ~KpWaitCondition();

    /// Gives up `mutex`, which the caller holds, waits to be woken, and takes it again. ULONG_MAX waits without a time
    /// limit. False after `milliseconds`, silently, or when the platform fails. The deadline is on the wall clock, so a
    /// change of the system time moves it.
    bool wait(KpMutex* mutex, unsigned long milliseconds);

    /// Wakes one of those who wait, or all; nothing happens when nobody waits.
    void wakeOne();
    void wakeAll();

private:
    KpWaitConditionPrivate* condition_;
};
