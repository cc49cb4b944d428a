#include <kplib/foundation/KpMutex.h>

#include <kplib/foundation/detail/KpMutexPrivate.h>

#include <atomic>
#include <cstdio>

namespace {

void printFailure(const char* format, int errorCode)
{
    std::printf(format, errorCode);
}

constinit std::atomic<KpLockFailureReport> failureReport{printFailure};

}  // namespace

void kpSetLockFailureReport(KpLockFailureReport report)
{
    failureReport = report ? report : printFailure;
}

void kplib::detail::reportLockFailure(const char* format, int errorCode)
{
    failureReport.load()(format, errorCode);
}

KpMutex _KpSingleton_Mutex(true);  // NOLINT(bugprone-reserved-identifier)

KpMutex::KpMutex(bool recursive) : record_(new KpMutexPrivate)
{
    pthread_mutexattr_t attributes;
    pthread_mutexattr_init(&attributes);
    pthread_mutexattr_settype(&attributes, recursive ? PTHREAD_MUTEX_RECURSIVE : PTHREAD_MUTEX_DEFAULT);
    pthread_mutex_init(&record_->mutex, &attributes);
    record_->recursive = recursive;
    pthread_mutexattr_destroy(&attributes);
}

KpMutex::~KpMutex()
{
    pthread_mutex_destroy(&record_->mutex);
    delete record_;
}

bool KpMutex::isRecursive() const
{
    return record_->recursive;
}

void KpMutex::lock()
{
    pthread_mutex_lock(&record_->mutex);
}

bool KpMutex::tryLock()
{
    return pthread_mutex_trylock(&record_->mutex) == 0;
}

void KpMutex::unlock()
{
    if (const int error = pthread_mutex_unlock(&record_->mutex))
        kplib::detail::reportLockFailure("KpMutex::unlock() failed (error code: %d)\n", error);
}
