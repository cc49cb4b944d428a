#pragma once

#include <kplib/foundation/KpExport.h>

struct KpMutexPrivate;

/// Receives the failures of KpMutex and KpWaitCondition: `format` is a printf format for `errorCode`.
using KpLockFailureReport = void (*)(const char* format, int errorCode);

/// Sets the receiver; null restores the default, which prints to standard output. The log sets itself here at its first
/// use, which comes no later than static initialisation. Set it before other threads start.
KPLIB_API void kpSetLockFailureReport(KpLockFailureReport report);

/// Mutual exclusion, recursive on request.
///
/// Failures of the platform do not throw: unlock() writes them to the log, the others ignore them.
/// The caller ensures that a mutex is unlocked when it is destroyed, and that a plain one is
/// unlocked by the thread that holds it.
class KPLIB_API KpMutex {
public:
    /// An unlocked mutex. With `recursive` its holder may lock it again, and unlocks it as often.
    explicit KpMutex(bool recursive);
    KpMutex(const KpMutex&) = delete;
    KpMutex& operator=(const KpMutex&) = delete;
    virtual ~KpMutex();

    /// Whether its holder may lock it again.
    bool isRecursive() const;

    /// Blocks until the mutex is held.
    void lock();

    /// Locks the mutex if it is free, and returns whether it did.
    bool tryLock();

    /// Gives up one lock. A failure is one error line in the log.
    void unlock();

private:
    friend class KpWaitCondition;

    KpMutexPrivate* record_;  // keeps the platform's thread header out of here
};

/// Holds a lock for the length of a scope; null holds nothing. Nests on a recursive KpMutex.
template <typename Lock>
class KpScopedLockT {
public:
    /// Locks `lock`.
    explicit KpScopedLockT(Lock* lock) : lock_(lock)
    {
        if (lock_)
            lock_->lock();
    }
    KpScopedLockT(const KpScopedLockT&) = delete;
    KpScopedLockT& operator=(const KpScopedLockT&) = delete;

    /// Ends the process if the unlocking throws.
    ~KpScopedLockT()
    {
        if (lock_)
            lock_->unlock();
        lock_ = nullptr;
    }

private:
    Lock* lock_;
};

/// One recursive lock for all modules of the system, to guard the making of singletons on first
/// use. Valid from static initialisation until exit. The name is a reserved one for compatibility
/// with existing modules.
extern KPLIB_API KpMutex _KpSingleton_Mutex;  // NOLINT(bugprone-reserved-identifier)
