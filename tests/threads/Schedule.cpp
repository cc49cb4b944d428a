#include "Schedule.h"

#include <atomic>
#include <cerrno>
#include <pthread.h>
#include <sched.h>
#include <unistd.h>

// The linker sends the calls of the library and of the tests here, see CMakeLists.txt.

namespace {

std::atomic<unsigned> seed = 0;  // 0: no delays
std::atomic<bool> noNewThreads = false;

void linger()
{
    if (seed.load(std::memory_order_relaxed) == 0)
        return;
    const unsigned random = seed.fetch_add(2654435769u, std::memory_order_relaxed) * 2246822519u >> 16;
    if (random % 16 == 0)
        usleep(random / 16 % 64);
    else if (random % 4 == 0)
        sched_yield();
}

}  // namespace

extern "C" {
int __real_pthread_mutex_lock(pthread_mutex_t* mutex);
int __wrap_pthread_mutex_lock(pthread_mutex_t* mutex);
int __real_pthread_cond_wait(pthread_cond_t* condition, pthread_mutex_t* mutex);
int __wrap_pthread_cond_wait(pthread_cond_t* condition, pthread_mutex_t* mutex);
int __real_pthread_cond_signal(pthread_cond_t* condition);
int __wrap_pthread_cond_signal(pthread_cond_t* condition);
int __real_pthread_create(pthread_t* id, const pthread_attr_t* attributes, void* (*entry)(void*), void* argument);
int __wrap_pthread_create(pthread_t* id, const pthread_attr_t* attributes, void* (*entry)(void*), void* argument);

int __wrap_pthread_mutex_lock(pthread_mutex_t* mutex)
{
    linger();
    return __real_pthread_mutex_lock(mutex);
}

int __wrap_pthread_cond_wait(pthread_cond_t* condition, pthread_mutex_t* mutex)
{
    linger();
    return __real_pthread_cond_wait(condition, mutex);
}

int __wrap_pthread_cond_signal(pthread_cond_t* condition)
{
    linger();
    return __real_pthread_cond_signal(condition);
}

int __wrap_pthread_create(pthread_t* id, const pthread_attr_t* attributes, void* (*entry)(void*), void* argument)
{
    return noNewThreads ? EAGAIN : __real_pthread_create(id, attributes, entry, argument);
}
}

namespace kplib::test {

RandomSchedule::RandomSchedule(unsigned from)
{
    seed = 2 * from + 1;
}

RandomSchedule::~RandomSchedule()
{
    seed = 0;
}

NoNewThreads::NoNewThreads()
{
    noNewThreads = true;
}

NoNewThreads::~NoNewThreads()
{
    noNewThreads = false;
}

}  // namespace kplib::test
