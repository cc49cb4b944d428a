#pragma once

#include <pthread.h>

struct KpMutexPrivate {
    pthread_mutex_t mutex;
    bool recursive;
};
