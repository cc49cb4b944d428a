#include <kplib/threads/KpThread.h>

#include <kplib/foundation/KpMutex.h>
#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpWaitCondition.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/platform/Platform.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdint>
#include <ctime>
#include <limits>
#include <pthread.h>
#include <sched.h>
#include <unistd.h>

namespace {

using Lock = KpScopedLockT<KpMutex>;

enum State { NeverStarted, Running, Finished };

std::atomic<int> threadCount = 0;

KpString nameOfNext(const char* name)
{
    const int number = threadCount++;
    return name ? KpString(name) : KpString(0, "KpThread %d", number);
}

}  // namespace

struct KpThreadPrivate {
    explicit KpThreadPrivate(const char* given) : name(nameOfNext(given)) {}

    static KpThreadPrivate* make(const char* name, const char* failure);
    static void* startIt(void* object);

    pthread_attr_t attributes{};
    pthread_t threadId{};
    std::atomic<int> state = NeverStarted;  // written under the mutex, as the next
    std::atomic<bool> isMade = false;       // the last start() had a thread
    KpMutex mutex{false};
    KpWaitCondition finishedCondition;
    KpString name;
};

// `failure`: the error line, formatted with the error's code.
KpThreadPrivate* KpThreadPrivate::make(const char* name, const char* failure)
{
    auto* const record = new KpThreadPrivate(name);
    if (const int error = pthread_attr_init(&record->attributes))
        getTheLogInstance().errorf(failure, error);
    return record;
}

void* KpThreadPrivate::startIt(void* object)
{
    auto& thread = *static_cast<KpThread*>(object);
    thread.run();
    KpThreadPrivate& record = *thread.record_;
    const Lock lock(&record.mutex);  // held by start() until the state says Running
    record.state.store(Finished, std::memory_order_release);
    record.finishedCondition.wakeAll();
    return nullptr;
}

KpThread::KpThread() : record_(KpThreadPrivate::make(nullptr, "KpThread::KpThread() failed (error code: %d)\n")) {}

KpThread::KpThread(const char* name) :
    record_(KpThreadPrivate::make(name, "KpThread::KpThread(const char*) failed (error code: %d)\n"))
{
}

KpThread::~KpThread()
{
    // A thread that finished() reports as ended may still hold the mutex.
    record_->mutex.lock();
    record_->mutex.unlock();
    const int error = pthread_attr_destroy(&record_->attributes);
    delete record_;
    if (error)
        getTheLogInstance().errorf("KpThread::~KpThread() failed (error code: %d)\n", error);
}

void KpThread::start()
{
    const Lock lock(&record_->mutex);
    while (hasThread())
        record_->finishedCondition.wait(&record_->mutex, ULONG_MAX);
    const int error = pthread_create(&record_->threadId, &record_->attributes, KpThreadPrivate::startIt, this);
    if (error)
        // Intentional: the text names the destructor, and tools that read logs depend on it.
        getTheLogInstance().warnf("KpThread::~KpThread() failed (error code: %d)\n", error);
    else
        pthread_detach(record_->threadId);
    record_->isMade.store(error == 0, std::memory_order_relaxed);  // before the state, which publishes it
    record_->state.store(Running, std::memory_order_release);
}

bool KpThread::wait(unsigned long milliseconds)
{
    const Lock lock(&record_->mutex);
    return !running() || (hasThread() && record_->finishedCondition.wait(&record_->mutex, milliseconds));
}

bool KpThread::finished() const
{
    return record_->state.load(std::memory_order_acquire) == Finished;
}

bool KpThread::running() const
{
    return record_->state.load(std::memory_order_acquire) == Running;
}

bool KpThread::hasThread() const
{
    return running() && record_->isMade.load(std::memory_order_relaxed);
}

void KpThread::yield()
{
    sched_yield();
}

namespace {

void sleepFor(unsigned long seconds, long nanoseconds)
{
    constexpr unsigned long longest = std::numeric_limits<time_t>::max();
    timespec left{static_cast<time_t>(std::min(seconds, longest)), nanoseconds};
    while (nanosleep(&left, &left) != 0 && errno == EINTR) {
    }
}

}  // namespace

void KpThread::sleep(unsigned long seconds)
{
    sleepFor(seconds, 0);
}

void KpThread::msleep(unsigned long milliseconds)
{
    usleep(static_cast<std::uint32_t>(milliseconds) * std::uint32_t{1000});  // intentional: in 32 bits
}

void KpThread::usleep(unsigned long microseconds)
{
    constexpr unsigned long perSecond = 1'000'000;
    sleepFor(microseconds / perSecond, static_cast<long>(microseconds % perSecond * 1000));
}

const char* KpThread::threadName() const
{
    return record_->name.c_str();
}

void KpThread::setThreadName(const char* name)
{
    record_->name = name;
}

void KpThread::setThreadNameNative(const char* name)
{
    if (name)
        kplib::platform::setThreadName(name);
}

int tmCurrentProcessId()
{
    return getpid();
}

unsigned long tmCurrentThreadId()
{
    return pthread_self();
}

unsigned long tmMainThreadId()
{
    static std::atomic<unsigned long> sMainThreadId = 0;
    unsigned long id = 0;
    const unsigned long caller = tmCurrentThreadId();
    return sMainThreadId.compare_exchange_strong(id, caller) ? caller : id;
}

bool tmIsMainThread()
{
    return tmMainThreadId() == tmCurrentThreadId();
}
