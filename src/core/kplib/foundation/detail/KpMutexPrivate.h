#pragma once

#include <pthread.h>

struct KpMutexPrivate {
    pthread_mutex_t mutex;
    bool recursive;
};

namespace kplib::detail {

// Hands a failed lock operation to the receiver of kpSetLockFailureReport().
void reportLockFailure(const char* format, int errorCode);

}  // namespace kplib::detail
