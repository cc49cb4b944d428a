#include <kplib/foundation/KpThreadLocalStorage.h>

#include <pthread.h>

struct KpThreadLocalStoragePrivate {
    pthread_key_t key = ~pthread_key_t{0};  // never valid: if none can be created, no other key is used
};

KpThreadLocalStorageBase::KpThreadLocalStorageBase() : KpThreadLocalStorageBase(nullptr) {}

KpThreadLocalStorageBase::KpThreadLocalStorageBase(void (*destructor)(void*)) : key_(new KpThreadLocalStoragePrivate)
{
    pthread_key_create(&key_->key, destructor);
}

KpThreadLocalStorageBase::~KpThreadLocalStorageBase()
{
    if (pthread_key_delete(key_->key) == 0)
        delete key_;  // intentional: if the platform keeps the key, its record is leaked
}

void* KpThreadLocalStorageBase::get() const
{
    return pthread_getspecific(key_->key);
}

void KpThreadLocalStorageBase::set(void* value)
{
    pthread_setspecific(key_->key, value);
}
