#pragma once

#include <kplib/foundation/KpExport.h>

#include <atomic>

/// Base of objects that KpHandle counts and that threads share; otherwise as KpHandable.
///
/// Any thread that has a handle may copy and drop it. Whatever a thread did with the object before it dropped its
/// handle is seen by the destructor.
class KPLIB_API KpHandableThreaded {
public:
    KpHandableThreaded() = default;
    /// As the assignment below: a copy has a count of 0.
    KpHandableThreaded(const KpHandableThreaded&) noexcept {}
    /// Does nothing: the count belongs to the object, not to its value.
    KpHandableThreaded& operator=(const KpHandableThreaded&) noexcept { return *this; }
    virtual ~KpHandableThreaded();

    /// Runs once before the object is deleted, while it is whole. It may take and drop handles to the object.
    virtual void notifyDelete();

    /// One atomic instruction.
    void ref() const { refCount_.fetch_add(1, std::memory_order_relaxed); }

    /// Deletes the object with its last reference.
    void unref() const
    {
        // The spin lock is only for threads that may bring the count to 0; dropping one reference
        // of several needs none.
        for (int n = refCount_.load(std::memory_order_relaxed); n > 1;) {
            if (refCount_.compare_exchange_weak(n, n - 1, std::memory_order_release, std::memory_order_relaxed))
                return;
        }
        unrefLast();
    }

    /// Never deletes, so that an object can leave the scope that held it with a count of 0.
    void unrefNoDelete() const { refCount_.fetch_sub(1, std::memory_order_release); }

    /// The number of references; 0 during destruction.
    int refCount() const
    {
        const int n = refCount_.load(std::memory_order_relaxed);
        return n < destructionCount ? n : 0;
    }
    /// Whether the last reference is gone and the destruction has begun.
    bool isDestructionInProgress() const { return refCount_.load(std::memory_order_relaxed) >= destructionCount; }

    /// Whether there is no reference: none was ever taken, or all are dropped. Takes the spin
    /// lock.
    bool isVirgin() const;

private:
    static constexpr int destructionCount = 0xffffff;  // the count of an object whose destruction is decided

    void unrefLast() const;
    void lock() const;
    void unlock() const { spinLock_.store(0, std::memory_order_release); }

    mutable std::atomic<unsigned char> spinLock_ = 0;
    mutable std::atomic<int> refCount_ = 0;
};
