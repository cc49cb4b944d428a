#include <kplib/foundation/KpWaitCondition.h>

#include <kplib/foundation/KpMutex.h>
#include <kplib/foundation/detail/Deadline.h>
#include <kplib/foundation/detail/KpMutexPrivate.h>

#include <climits>

struct KpWaitConditionPrivate {
    pthread_cond_t condition;
};

KpWaitCondition::KpWaitCondition() : condition_(new KpWaitConditionPrivate)
{
    if (const int error = pthread_cond_init(&condition_->condition, nullptr))
        kplib::detail::reportLockFailure("KpWaitCondition::KpWaitCondition() failed (error code: %d)\n", error);
}

KpWaitCondition::~KpWaitCondition()
{
    const int error = pthread_cond_destroy(&condition_->condition);
    delete condition_;
    if (error)
        kplib::detail::reportLockFailure("KpWaitCondition::~KpWaitCondition() failed (error code: %d)\n", error);
}

bool KpWaitCondition::wait(KpMutex* mutex, unsigned long milliseconds)
{
    if (milliseconds == ULONG_MAX) {
        const int error = pthread_cond_wait(&condition_->condition, &mutex->record_->mutex);
        if (error)
            kplib::detail::reportLockFailure("KpWaitCondition::wait() failed (error code: %d)\n", error);
        return error == 0;
    }
    timeval now{};
    gettimeofday(&now, nullptr);
    const timespec deadline = kplib::detail::deadlineAfter(now, milliseconds);
    return pthread_cond_timedwait(&condition_->condition, &mutex->record_->mutex, &deadline) == 0;
}

void KpWaitCondition::wakeOne()
{
    if (const int error = pthread_cond_signal(&condition_->condition))
        kplib::detail::reportLockFailure("KpWaitCondition::wakeOne() failed (error code: %d)\n", error);
}

void KpWaitCondition::wakeAll()
{
    if (const int error = pthread_cond_broadcast(&condition_->condition))
        kplib::detail::reportLockFailure("KpWaitCondition::wakeAll() failed (error code: %d)\n", error);
}
