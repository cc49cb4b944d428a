#include "Schedule.h"

#include <cerrno>
#include <pthread.h>
#include <sched.h>
#include <unistd.h>

std::atomic<unsigned> kplib::test::scheduleSeed = 0;
std::atomic<bool> kplib::test::noNewThreads = false;

static void linger()
{
    if (kplib::test::scheduleSeed == 0)
        return;
    const unsigned random = kplib::test::scheduleSeed.fetch_add(2654435769u) * 2246822519u >> 16;
    if (random % 16 == 0)
        usleep(random / 16 % 64);
    else if (random % 4 == 0)
        sched_yield();
}

// The linker puts these in place of the platform's, see CMakeLists.txt.
extern "C" {
#define KPLIB_LINGER_BEFORE(function, parameters, arguments)                                                           \
    int __real_##function parameters;                                                                                  \
    int __wrap_##function parameters;                                                                                  \
    int __wrap_##function parameters                                                                                   \
    {                                                                                                                  \
        linger();                                                                                                      \
        return __real_##function arguments;                                                                            \
    }
KPLIB_LINGER_BEFORE(pthread_mutex_lock, (pthread_mutex_t * mutex), (mutex))
KPLIB_LINGER_BEFORE(pthread_cond_wait, (pthread_cond_t * condition, pthread_mutex_t* mutex), (condition, mutex))
KPLIB_LINGER_BEFORE(pthread_cond_signal, (pthread_cond_t * condition), (condition))
KPLIB_LINGER_BEFORE(pthread_cond_broadcast, (pthread_cond_t * condition), (condition))

int __real_pthread_create(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*);
int __wrap_pthread_create(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*);
int __wrap_pthread_create(pthread_t* id, const pthread_attr_t* attributes, void* (*entry)(void*), void* argument)
{
    return kplib::test::noNewThreads ? EAGAIN : __real_pthread_create(id, attributes, entry, argument);
}
}
