#pragma once

#include <kplib/foundation/KpExport.h>

#include <climits>

class KpWorkerThreadPrivate;

/// One long-lived thread that performs one job again and again, whenever it is asked to.
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
/// A subclass provides compute(), and stores the input of a pass before start(). There is no queue: one pass at a time.
/// A pass costs two hand-overs between threads, not the making of one.
///
///     NotStarted --start--> Idle --start--> Computing --end of the pass--> Idle
///     Computing --suspend--> SuspendRequested --suspended()--> Suspended --resume--> Computing
///     Computing --cancel--> CancelRequested --end of the pass--> CanceledIdle, which accepts a start as Idle does
///     Idle, CanceledIdle --terminate--> TerminateRequested --computeDtor()--> NotStarted
///
/// Two threads take part, the worker and one caller at a time; state(), canceled() and suspended() may be polled at the
/// cost of a load. Requests bind only a compute() that polls. An exception that leaves compute() ends the process.
class KPLIB_API KpWorkerThread {
public:
    /// The state of the worker.
    enum State {
        NotStarted,         ///< no thread
        Idle,               ///< waits for start()
        Computing,          ///< compute() runs
        Suspended,          ///< compute() sleeps in suspended()
        CanceledIdle,       ///< waits for start(), the last pass was canceled
        SuspendRequested,   ///< compute() hasn't noticed yet
        CancelRequested,    ///< compute() hasn't returned yet
        TerminateRequested  ///< the thread is about to end
    };

    /// No thread yet.
    explicit KpWorkerThread(const char* name);
    KpWorkerThread(const KpWorkerThread&) = delete;
    KpWorkerThread& operator=(const KpWorkerThread&) = delete;
    /// Terminates. A subclass calls terminate() in its own destructor: here compute() is gone already.
    virtual ~KpWorkerThread();

    /// Runs on the worker thread before its first pass, to set up what belongs to the thread.
    virtual void computeCtor();
    /// One pass.
    virtual void compute() = 0;
    /// Runs on the worker thread after its last pass.
    virtual void computeDtor();

    /// Hands over one pass; the first one makes the thread, and waits for computeCtor(). With `waitForCaller` it
    /// returns when the pass has ended, or has called wakeCaller(). False, and nothing is done, if a pass is under way,
    /// or if no thread can be made, which is a warning in the log.
    bool start(bool waitForCaller);

    /// Waits until the pass has ended or sleeps in suspended(). False at once if there was none. With `timedOut` it is
    /// still under way after `milliseconds`, which each wake-up counts anew, and the result is true.
    bool wait(bool& timedOut, unsigned long milliseconds = ULONG_MAX);
    /// Without a time limit.
    bool wait();

    /// Asks the pass to pause in its next suspended(). False if none is computing.
    bool suspend();
    /// Lets a suspended pass go on. False if nothing slept; a request to pause is withdrawn all the same.
    bool resume();
    /// Asks the pass, suspended or not, to end early. False if there is none to ask.
    bool cancel();
    /// Waits for the pass, a suspended one is resumed, and ends the thread; start() makes a new one. Always false.
    bool terminate();

    /// The State; the worker may change it at any time.
    int state() const;

    /// The name, valid until it changes. The thread takes it over as it starts.
    const char* name() const;
    /// Replaces the name.
    void setName(const char* name);

    /// For compute(): whether to end early.
    bool canceled();
    /// For compute(): sleeps here until resume() or cancel(), if suspend() asked for it. True if it did.
    bool suspended();
    /// For compute(): lets start(true) return before the pass has ended.
    void wakeCaller();

    /// Times 500 passes and writes the rate to the log.
    static void test();

private:
    KpWorkerThreadPrivate* record_;
};
