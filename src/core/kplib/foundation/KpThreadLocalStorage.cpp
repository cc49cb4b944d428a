#include <kplib/foundation/KpThreadLocalStorage.h>

#include <pthread.h>

struct KpThreadLocalStoragePrivate {
    pthread_key_t key = ~pthread_key_t{0};  // nobody's, so that a key that could not be made touches no other
};

KpThreadLocalStorageBase::KpThreadLocalStorageBase() : KpThreadLocalStorageBase(nullptr) {}

KpThreadLocalStorageBase::KpThreadLocalStorageBase(void (*destructor)(void*)) : key_(new KpThreadLocalStoragePrivate)
{
    pthread_key_create(&key_->key, destructor);
}

KpThreadLocalStorageBase::~KpThreadLocalStorageBase()
{
    if (pthread_key_delete(key_->key) == 0)
        delete key_;  // a key that the platform doesn't let go keeps its memory, and that is meant
}

void* KpThreadLocalStorageBase::get() const
{
    return pthread_getspecific(key_->key);
}

void KpThreadLocalStorageBase::set(void* value)
{
    pthread_setspecific(key_->key, value);
}
