#pragma once

#include <kplib/foundation/KpExport.h>

#include <climits>

struct KpThreadPrivate;

/// A thread of the platform that runs run() of a subclass, and can do so again when that has ended.
///
/// The object must outlive its run: its owner calls wait() before the destructor. An exception that leaves run() ends
/// the process. Failures of the platform don't throw: they are written to the log. finished() and running() may be
/// polled from any thread.
class KPLIB_API KpThread {
public:
    /// Named "KpThread %d" with the number of the objects made before.
    KpThread();
    /// Named so; null takes the generated name. The object counts in either case.
    explicit KpThread(const char* name);
    KpThread(const KpThread&) = delete;
    KpThread& operator=(const KpThread&) = delete;
    /// Neither stops the thread nor waits for it.
    virtual ~KpThread();

    /// What the thread does.
    virtual void run() = 0;

    /// Runs run() on a new thread; when one runs already, blocks until that has ended. If no thread can be made, a
    /// warning is in the log, and the object counts as running until a later start() has a thread that ends.
    void start();

    /// Waits for the end of the run, at most `milliseconds`, ULONG_MAX for no limit. False if that was too short, and
    /// at once if start() could make no thread; true if there was nothing to wait for. Waits once: a wake-up without a
    /// cause counts as the end.
    bool wait(unsigned long milliseconds = ULONG_MAX);

    /// Whether a run has ended, and none has begun since. What run() wrote is then visible.
    bool finished() const;
    /// Whether start() was called and the run has not ended.
    bool running() const;

    /// Gives up the processor.
    static void yield();
    /// Suspend the caller for at least that time; a signal doesn't cut it short. msleep() counts microseconds in 32
    /// bits, so its longest time is some 71 minutes, and longer ones wrap.
    static void sleep(unsigned long seconds);
    /// As sleep(), in milliseconds.
    static void msleep(unsigned long milliseconds);
    /// As sleep(), in microseconds.
    static void usleep(unsigned long microseconds);

    /// The name, valid until it changes.
    const char* threadName() const;
    /// Replaces the name.
    void setThreadName(const char* name);

    /// Names the calling thread for the tools of the platform, which may keep its first characters only.
    void setThreadNameNative(const char* name);

protected:
    /// Whether a run is under way: running(), but false if start() could make no thread.
    bool hasThread() const;

private:
    friend struct KpThreadPrivate;

    KpThreadPrivate* record_;  // keeps the platform's thread header out of here
};

/// The number of this process.
KPLIB_API int tmCurrentProcessId();
/// The platform's identifier of the calling thread, never 0.
KPLIB_API unsigned long tmCurrentThreadId();

/// The main thread is whichever asks first for one of these two, so an application asks from its real one at start-up.
KPLIB_API unsigned long tmMainThreadId();
/// Whether this is the main thread, see tmMainThreadId().
KPLIB_API bool tmIsMainThread();
