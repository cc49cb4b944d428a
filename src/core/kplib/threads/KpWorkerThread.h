#pragma once

#include <kplib/foundation/KpExport.h>

#include <climits>

class KpWorkerThreadPrivate;

/// One long-lived thread that performs the same job repeatedly on request.
///
///     struct Sum : KpWorkerThread {
///         Sum() : KpWorkerThread("Sum") {}
///         ~Sum() override { terminate(); }
///         void compute() override { result = a + b; }
///         int a = 0, b = 0, result = 0;
///     } sum;
///     sum.a = 3, sum.b = 4;
///     sum.start(true);  // until the pass has ended
///     std::printf("%d\n", sum.result);  // prints: 7
///
/// A subclass implements compute() and stores the input of a pass before start(). There is no
/// queue: one pass at a time. A pass costs two hand-overs between threads and creates no thread.
///
///     NotStarted --start--> Idle --start--> Computing --end of the pass--> Idle
///     Computing --suspend--> SuspendRequested --suspended()--> Suspended --resume--> Computing
///     Computing --cancel--> CancelRequested --end of the pass--> CanceledIdle, which accepts a start as Idle does
///     Idle, CanceledIdle --terminate--> TerminateRequested --computeDtor()--> NotStarted
///
/// Threads: the worker and one caller at a time. state(), canceled() and suspended() may be polled
/// at the cost of a load. Requests have an effect only if compute() polls. An exception that
/// leaves compute() ends the process.
class KPLIB_API KpWorkerThread {
public:
    /// The state of the worker.
    enum State {
        NotStarted,         ///< no thread
        Idle,               ///< waits for start()
        Computing,          ///< compute() runs
        Suspended,          ///< compute() sleeps in suspended()
        CanceledIdle,       ///< waits for start(), the last pass was canceled
        SuspendRequested,   ///< compute() has not polled yet
        CancelRequested,    ///< compute() has not returned yet
        TerminateRequested  ///< the thread is about to end
    };

    /// No thread yet.
    explicit KpWorkerThread(const char* name);
    KpWorkerThread(const KpWorkerThread&) = delete;
    KpWorkerThread& operator=(const KpWorkerThread&) = delete;
    /// Calls terminate(). A subclass must call terminate() in its own destructor: here its
    /// compute() no longer exists.
    virtual ~KpWorkerThread();

    /// Called on the worker thread before its first pass, to initialise data of the thread.
    virtual void computeCtor();
    /// One pass.
    virtual void compute() = 0;
    /// Called on the worker thread after its last pass.
    virtual void computeDtor();

    /// Starts one pass. The first call creates the thread and waits for computeCtor(). With
    /// `waitForCaller` returns when the pass has ended or has called wakeCaller(). Returns false
    /// and does nothing if a pass is under way, or if no thread can be created, which is a warning
    /// in the log.
    bool start(bool waitForCaller);

    /// Waits until the pass has ended or sleeps in suspended(). Returns false at once if there is
    /// no pass, else true. `timedOut` receives whether the pass is still under way after
    /// `milliseconds`; each wake-up restarts that time.
    bool wait(bool& timedOut, unsigned long milliseconds = ULONG_MAX);
    /// Without a time limit.
    bool wait();

    /// Requests the pass to pause in its next suspended(). Returns false if no pass is computing.
    bool suspend();
    /// Continues a suspended pass. Returns false if no pass is suspended; a pending request to
    /// pause is withdrawn in any case.
    bool resume();
    /// Requests the pass, suspended or not, to end early. Returns false if there is no pass.
    bool cancel();
    /// Continues the pass if it is suspended, waits for its end, and ends the thread; start()
    /// creates a new one. Always returns false.
    bool terminate();

    /// The State; the worker may change it at any time.
    int state() const;

    /// The name, valid until it changes. The thread takes the name that is set when it starts.
    const char* name() const;
    /// Replaces the name.
    void setName(const char* name);

    /// For compute(): whether to end early.
    bool canceled();
    /// For compute(): sleeps until resume() or cancel() if suspend() has requested it, and returns
    /// whether it did.
    bool suspended();
    /// For compute(): makes start(true) return before the pass has ended.
    void wakeCaller();

    /// Times 500 passes and writes the rate to the log.
    static void test();

private:
    KpWorkerThreadPrivate* record_;
};
