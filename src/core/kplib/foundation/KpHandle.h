#pragma once

#include <kplib/foundation/KpCheck.h>

#include <utility>

/// Smart pointer to an object that counts its handles: a T with ref() and unref(), such as a KpHandable.
///
/// One pointer wide. T may be incomplete where handles are only declared. Access is unchecked. Copies on several
/// threads are as safe as the counter of T; one handle object belongs to one thread at a time.
template <typename T>
class KpHandle {
public:
    KpHandle() noexcept = default;
    KpHandle(T* object) : pointer_(object)
    {
        if (pointer_)
            pointer_->ref();
    }
    KpHandle(const KpHandle& other) : KpHandle(other.pointer_) {}
    KpHandle(KpHandle&& other) noexcept : pointer_(std::exchange(other.pointer_, nullptr)) {}

    /// The pointer is cleared before the object goes, so that what the object does in its end doesn't find it here.
    ~KpHandle()
    {
        if (T* const old = std::exchange(pointer_, nullptr))
            old->unref();
    }

    /// Nothing happens when the pointer is the same. The new object is held before the old one is let go, so that a
    /// chain survives in which the old one holds the new one.
    KpHandle& operator=(T* object)
    {
        if (object == pointer_)
            return *this;
        T* const old = std::exchange(pointer_, object);
        if (object)
            object->ref();
        if (old)
            old->unref();
        return *this;
    }
    // NOLINTNEXTLINE(bugprone-unhandled-self-assignment): the same pointer is left alone
    KpHandle& operator=(const KpHandle& other) { return *this = other.pointer_; }
    KpHandle& operator=(KpHandle&& other) noexcept
    {
        KpHandle(std::move(other)).swap(*this);
        return *this;
    }

    void swap(KpHandle& other) noexcept { std::swap(pointer_, other.pointer_); }

    T* get() const noexcept { return pointer_; }
    T* operator->() const noexcept
    {
        KPLIB_CHECK(pointer_ != nullptr, "KpHandle: dereferenced while null");
        return pointer_;
    }
    T& operator*() const noexcept
    {
        KPLIB_CHECK(pointer_ != nullptr, "KpHandle: dereferenced while null");
        return *pointer_;
    }
    explicit operator bool() const noexcept { return pointer_ != nullptr; }

    bool operator==(const KpHandle& other) const noexcept { return pointer_ == other.pointer_; }
    bool operator==(const T* object) const noexcept { return pointer_ == object; }

private:
    T* pointer_ = nullptr;
};
