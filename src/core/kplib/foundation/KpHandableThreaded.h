#pragma once

#include <kplib/foundation/KpExport.h>

#include <atomic>

/// Base of objects that threads share and whose handles are counted by KpHandle; otherwise as
/// KpHandable.
///
/// Any thread that has a handle may copy and release it. All changes that a thread makes to the
/// object before it releases its handle are visible to the destructor.
class KPLIB_API KpHandableThreaded {
public:
    KpHandableThreaded() = default;
    /// As the assignment below: a copy has a count of 0.
    KpHandableThreaded(const KpHandableThreaded&) noexcept {}
    /// Does nothing: the count belongs to the object, not to its value.
    KpHandableThreaded& operator=(const KpHandableThreaded&) noexcept { return *this; }
    virtual ~KpHandableThreaded();

    /// Called once before the object is deleted, while it is complete. May take and release
    /// handles to the object.
    virtual void notifyDelete();

    /// Adds a reference by one atomic instruction.
    void ref() const { refCount_.fetch_add(1, std::memory_order_relaxed); }

    /// Removes a reference, and deletes the object with its last one.
    void unref() const
    {
        // The spin lock is only for threads that may bring the count to 0; removing one reference
        // of several needs none.
        for (int n = refCount_.load(std::memory_order_relaxed); n > 1;) {
            if (refCount_.compare_exchange_weak(n, n - 1, std::memory_order_release, std::memory_order_relaxed))
                return;
        }
        unrefLast();
    }

    /// Removes a reference but never deletes the object, so that it can leave the scope that held
    /// it with a count of 0.
    void unrefNoDelete() const { refCount_.fetch_sub(1, std::memory_order_release); }

    /// The number of references; 0 during destruction.
    int refCount() const
    {
        const int n = refCount_.load(std::memory_order_relaxed);
        return n < destructionCount ? n : 0;
    }
    /// Whether the last reference is gone and the destruction has begun.
    bool isDestructionInProgress() const { return refCount_.load(std::memory_order_relaxed) >= destructionCount; }

    /// Whether there is no reference: none was taken, or all are released. Takes the spin lock.
    bool isVirgin() const;

private:
    static constexpr int destructionCount = 0xffffff;  // the count of an object whose destruction is decided

    void unrefLast() const;
    void lock() const;
    void unlock() const { spinLock_.store(0, std::memory_order_release); }

    mutable std::atomic<unsigned char> spinLock_ = 0;
    mutable std::atomic<int> refCount_ = 0;
};
