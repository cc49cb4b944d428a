#pragma once

#include <kplib/foundation/KpExport.h>

#include <climits>

struct KpThreadPrivate;

/// A platform thread that runs run() of a subclass, and can run it again when it has ended.
///
/// The object must outlive the run: call wait() before the destructor. An exception that leaves
/// run() ends the process. Platform failures do not throw; they are written to the log. finished()
/// and running() may be polled from any thread.
class KPLIB_API KpThread {
public:
    /// The name is "KpThread %d" with the number of objects constructed before.
    KpThread();
    /// With that name; null stands for the generated name. The object is counted in both cases.
    explicit KpThread(const char* name);
    KpThread(const KpThread&) = delete;
    KpThread& operator=(const KpThread&) = delete;
    /// Neither stops the thread nor waits for it.
    virtual ~KpThread();

    /// The work of the thread.
    virtual void run() = 0;

    /// Runs run() on a new thread. If a run is under way, blocks until it has ended. If no thread
    /// can be created, logs a warning, and the object counts as running until a run of a later
    /// start() has ended.
    void start();

    /// Waits for the end of the run, at most `milliseconds`; ULONG_MAX is no limit. Returns true
    /// if the run has ended or there is none. Returns false if the time is too short, and at once
    /// if start() could create no thread. Waits once: a spurious wake-up counts as the end.
    bool wait(unsigned long milliseconds = ULONG_MAX);

    /// Whether a run has ended and no other has begun since. All writes of run() are then visible.
    bool finished() const;
    /// Whether start() was called and the run has not ended.
    bool running() const;

    /// Yields the processor.
    static void yield();
    /// Suspends the caller for at least that time; a signal does not shorten it. msleep() counts
    /// microseconds in 32 bits: its longest time is about 71 minutes, and longer times wrap.
    static void sleep(unsigned long seconds);
    /// As sleep(), in milliseconds.
    static void msleep(unsigned long milliseconds);
    /// As sleep(), in microseconds.
    static void usleep(unsigned long microseconds);

    /// The name, valid until it changes.
    const char* threadName() const;
    /// Replaces the name.
    void setThreadName(const char* name);

    /// Names the calling thread for the tools of the platform, which may truncate the name.
    void setThreadNameNative(const char* name);

protected:
    /// Whether a run is under way: running(), but false if start() could create no thread.
    bool hasThread() const;

private:
    friend struct KpThreadPrivate;

    KpThreadPrivate* record_;  // hides the platform's thread header
};

/// The id of this process.
KPLIB_API int tmCurrentProcessId();
/// The platform's identifier of the calling thread, never 0.
KPLIB_API unsigned long tmCurrentThreadId();

/// The id of the main thread, which is the first thread that calls this function or
/// tmIsMainThread(). Call one of them on the real main thread at start-up.
KPLIB_API unsigned long tmMainThreadId();
/// Whether this is the main thread, see tmMainThreadId().
KPLIB_API bool tmIsMainThread();
