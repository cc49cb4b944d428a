#include <kplib/foundation/KpHandableThreaded.h>

KpHandableThreaded::~KpHandableThreaded() = default;

void KpHandableThreaded::notifyDelete() {}

void KpHandableThreaded::unrefLast() const
{
    lock();
    if (refCount_.fetch_sub(1, std::memory_order_acq_rel) != 1) {
        unlock();
        return;
    }
    // If another thread has taken a reference since, without the lock, the object stays.
    int none = 0;
    const bool dies = refCount_.compare_exchange_strong(none, destructionCount, std::memory_order_acq_rel);
    unlock();
    if (dies) {
        const_cast<KpHandableThreaded*>(this)->notifyDelete();
        delete this;
    }
}

bool KpHandableThreaded::isVirgin() const
{
    lock();
    const bool isVirgin = refCount_.load(std::memory_order_acquire) == 0;
    unlock();
    return isVirgin;
}

// Held for two atomic operations at most, so there is nothing to sleep for.
void KpHandableThreaded::lock() const
{
    while (spinLock_.exchange(1, std::memory_order_acquire) != 0) {
    }
}
