#include <kplib/threads/KpWorkerThread.h>

#include <kplib/foundation/KpMutex.h>
#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpWaitCondition.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/system/KpWatch.h>
#include <kplib/threads/KpThread.h>

#include <atomic>
#include <cstdint>

namespace {

using Lock = KpScopedLockT<KpMutex>;

bool acceptsStart(int state)
{
    return state == KpWorkerThread::Idle || state == KpWorkerThread::CanceledIdle;
}

bool isBusy(int state)
{
    return state == KpWorkerThread::Computing || state > KpWorkerThread::CanceledIdle;
}

}  // namespace

// Plan
//
// Two mutexes, three conditions. The caller is any thread but the worker.
//
//     mutex           condition           waits                       is signalled by
//     stateMutex      workerCondition     worker: awaitPass(),        caller: start(), resume(),
//                                         suspended()                 cancel(), terminate()
//     stateMutex      callerCondition     caller: makeThread(),       worker: enter(), endPass(),
//                                         wait(), terminate()         suspended()
//     handshakeMutex  handshakeCondition  caller: start(true)         worker: endPass(),
//                                                                     wakeCaller()
//
// State, written under stateMutex and read anywhere:
//
//     NotStarted          --worker: run()-->        Idle
//     Idle, CanceledIdle  --caller: start()-->      Computing
//     Computing           --caller: suspend()-->    SuspendRequested
//     SuspendRequested    --worker: suspended()-->  Suspended
//     Suspended           --caller: resume()-->     Computing      also from SuspendRequested
//     Suspended           --caller: cancel()-->     CancelRequested
//                                                   also from Computing, SuspendRequested
//     CancelRequested     --worker: endPass()-->    CanceledIdle
//     Computing           --worker: endPass()-->    Idle           also from SuspendRequested
//     Idle, CanceledIdle  --caller: terminate()-->  TerminateRequested
//     TerminateRequested  --worker: run()-->        NotStarted
//
// `released` records that start(true) may return. Without it, the signal of a short pass would be
// lost if the pass ends before the caller waits.
//
// The two mutexes are never held together. start(), enter(), endPass() and wakeCaller() signal
// after unlocking: a woken thread would block on the mutex at once. The record outlives these
// signals, since terminate() returns only after the thread has left run().
class KpWorkerThreadPrivate final : public KpThread {
public:
    KpWorkerThreadPrivate(const char* label, KpWorkerThread* object) : KpThread(label), name(label), owner(object) {}

    void run() override;
    bool awaitPass();
    void endPass();
    void enter(int next);

    using KpThread::hasThread;
    bool makeThread();
    void awaitHandshake();
    void releaseHandshake();

    int now() const { return state.load(std::memory_order_acquire); }
    void set(int next) { state.store(next, std::memory_order_release); }

    KpString name;
    KpMutex stateMutex{false};
    KpWaitCondition callerCondition;
    KpWaitCondition workerCondition;
    KpMutex handshakeMutex{false};
    KpWaitCondition handshakeCondition;
    KpWorkerThread* owner;
    std::atomic<int> state = KpWorkerThread::NotStarted;  // written under stateMutex
    std::uint64_t startCount = 0;
    std::uint64_t computeCount = 0;
    // Whether start(true) may return; cleared under stateMutex, set under handshakeMutex.
    std::atomic<bool> released = false;
};

void KpWorkerThreadPrivate::run()
{
    setThreadNameNative(name.c_str());
    owner->computeCtor();
    enter(KpWorkerThread::Idle);
    while (awaitPass()) {
        owner->compute();
        ++computeCount;
        endPass();
    }
    owner->computeDtor();
    enter(KpWorkerThread::NotStarted);
}

// Waits for a pass. Returns false if the thread has to end.
bool KpWorkerThreadPrivate::awaitPass()
{
    const Lock lock(&stateMutex);
    while (acceptsStart(now()))
        workerCondition.wait(&stateMutex, ULONG_MAX);
    return now() != KpWorkerThread::TerminateRequested;
}

void KpWorkerThreadPrivate::endPass()
{
    releaseHandshake();
    {
        const Lock lock(&stateMutex);
        set(now() == KpWorkerThread::CancelRequested ? KpWorkerThread::CanceledIdle : KpWorkerThread::Idle);
    }
    // After the change of state: a caller that runs at once on the same processor then does not
    // block in wait().
    handshakeCondition.wakeAll();
    callerCondition.wakeOne();
}

void KpWorkerThreadPrivate::enter(int next)
{
    {
        const Lock lock(&stateMutex);
        set(next);
    }
    callerCondition.wakeOne();
}

// Returns false if the platform cannot create a thread.
bool KpWorkerThreadPrivate::makeThread()
{
    KpThread::start();
    if (!hasThread())
        return false;
    const Lock lock(&stateMutex);
    while (now() != KpWorkerThread::Idle)
        callerCondition.wait(&stateMutex, ULONG_MAX);
    return true;
}

void KpWorkerThreadPrivate::awaitHandshake()
{
    const Lock lock(&handshakeMutex);
    while (!released)
        handshakeCondition.wait(&handshakeMutex, ULONG_MAX);
}

void KpWorkerThreadPrivate::releaseHandshake()
{
    const Lock lock(&handshakeMutex);
    released = true;
}

KpWorkerThread::KpWorkerThread(const char* name) : record_(new KpWorkerThreadPrivate(name, this)) {}

KpWorkerThread::~KpWorkerThread()
{
    terminate();
    delete record_;
}

void KpWorkerThread::computeCtor() {}

void KpWorkerThread::computeDtor() {}

bool KpWorkerThread::start(bool waitForCaller)
{
    ++record_->startCount;
    if (!record_->hasThread() && !record_->makeThread())
        return false;
    {
        const Lock lock(&record_->stateMutex);
        if (!acceptsStart(record_->now()))
            return false;
        record_->released = false;  // the last pass has ended, and the next one has not begun
        record_->set(Computing);
    }
    record_->workerCondition.wakeOne();
    if (waitForCaller)
        record_->awaitHandshake();
    return true;
}

bool KpWorkerThread::wait(bool& timedOut, unsigned long milliseconds)
{
    timedOut = false;
    const Lock lock(&record_->stateMutex);
    if (!isBusy(record_->now()))
        return false;
    while (!timedOut && isBusy(record_->now()))
        timedOut = !record_->callerCondition.wait(&record_->stateMutex, milliseconds);
    return true;
}

bool KpWorkerThread::wait()
{
    bool timedOut = false;
    return wait(timedOut, ULONG_MAX);
}

bool KpWorkerThread::suspend()
{
    const Lock lock(&record_->stateMutex);
    if (record_->now() != Computing)
        return false;
    record_->set(SuspendRequested);
    return true;
}

bool KpWorkerThread::resume()
{
    const Lock lock(&record_->stateMutex);
    const int before = record_->now();
    if (before != Suspended && before != SuspendRequested)
        return false;
    record_->set(Computing);
    if (before == Suspended)
        record_->workerCondition.wakeOne();
    return before == Suspended;
}

bool KpWorkerThread::cancel()
{
    const Lock lock(&record_->stateMutex);
    const int before = record_->now();
    if (before != Computing && before != Suspended && before != SuspendRequested)
        return false;
    record_->set(CancelRequested);
    if (before == Suspended)
        record_->workerCondition.wakeOne();
    return true;
}

bool KpWorkerThread::terminate()
{
    if (!record_->hasThread())
        return false;
    wait();
    while (resume())
        wait();
    {
        const Lock lock(&record_->stateMutex);
        record_->set(TerminateRequested);
        record_->workerCondition.wakeOne();
        while (record_->now() == TerminateRequested)
            record_->callerCondition.wait(&record_->stateMutex, ULONG_MAX);
    }
    while (record_->running())
        KpThread::yield();
    return false;
}

int KpWorkerThread::state() const
{
    return record_->now();
}

const char* KpWorkerThread::name() const
{
    return record_->name.c_str();
}

void KpWorkerThread::setName(const char* name)
{
    record_->name = name;
}

bool KpWorkerThread::canceled()
{
    return record_->now() == CancelRequested;
}

bool KpWorkerThread::suspended()
{
    if (record_->now() != SuspendRequested)
        return false;
    const Lock lock(&record_->stateMutex);
    if (record_->now() == SuspendRequested)
        record_->set(Suspended);
    record_->callerCondition.wakeOne();
    while (record_->now() == Suspended)
        record_->workerCondition.wait(&record_->stateMutex, ULONG_MAX);
    return true;
}

void KpWorkerThread::wakeCaller()
{
    record_->releaseHandshake();
    record_->handshakeCondition.wakeAll();
}

void KpWorkerThread::test()
{
    struct Nothing final : KpWorkerThread {
        using KpWorkerThread::KpWorkerThread;
        ~Nothing() override { terminate(); }
        void compute() override {}
    };
    constexpr int passes = 500;
    Nothing worker("KpWorkerThread::test");
    KpWatch watch(true);
    for (int i = 0; i < passes; ++i) {
        worker.start(true);
        worker.wait();
    }
    getTheLogInstance().printf("KpWorkerThread::test(): %.0f passes per second\n", passes / watch.stop2());
}
