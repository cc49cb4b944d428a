#pragma once

#include <kplib/foundation/KpExport.h>

struct KpMutexPrivate;

/// Receives the failures of KpMutex and KpWaitCondition: `format` is a printf format for `errorCode`.
using KpLockFailureReport = void (*)(const char* format, int errorCode);

/// Sets the receiver. Null restores the default, which prints to standard output. The log sets
/// itself as the receiver at its first use, at the latest during static initialisation. Set it
/// before other threads start.
KPLIB_API void kpSetLockFailureReport(KpLockFailureReport report);

/// Mutual exclusion, recursive on request.
///
/// Platform failures do not throw: unlock() writes them to the log, the other functions ignore
/// them. Preconditions: a mutex is unlocked when it is destroyed, and a mutex that is not
/// recursive is unlocked by the thread that holds it.
class KPLIB_API KpMutex {
public:
    /// An unlocked mutex. If `recursive` is true, the thread that holds it may lock it again and
    /// must unlock it as often.
    explicit KpMutex(bool recursive);
    KpMutex(const KpMutex&) = delete;
    KpMutex& operator=(const KpMutex&) = delete;
    virtual ~KpMutex();

    /// Whether the thread that holds the mutex may lock it again.
    bool isRecursive() const;

    /// Blocks until the mutex is held.
    void lock();

    /// Locks the mutex if it is free, and returns whether it did.
    bool tryLock();

    /// Releases one lock. A failure is one error line in the log.
    void unlock();

private:
    friend class KpWaitCondition;

    KpMutexPrivate* record_;  // hides the platform's thread header
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

    /// Unlocks. Ends the process if that throws.
    ~KpScopedLockT()
    {
        if (lock_)
            lock_->unlock();
        lock_ = nullptr;
    }

private:
    Lock* lock_;
};

/// One recursive lock for all modules of the system, which guards the creation of singletons on
/// first use. Valid from static initialisation until exit. The reserved name is for compatibility
/// with existing modules.
extern KPLIB_API KpMutex _KpSingleton_Mutex;  // NOLINT(bugprone-reserved-identifier)
