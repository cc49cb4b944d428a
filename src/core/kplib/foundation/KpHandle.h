#pragma once

#include <kplib/foundation/KpCheck.h>

#include <cstddef>
#include <typeindex>  // declares std::hash
#include <utility>

/// Smart pointer to an object that counts its handles: a T with ref() and unref(), such as a KpHandable.
///
///     struct Image : KpHandable { int number = 7; };
///     KpHandle<Image> image(new Image);  // deleted with the last handle
///     KpHandle<Image> again = image;
///     std::printf("%d, %d handles\n", again->number, image->refCount());  // prints: 7, 2 handles
///
/// One pointer wide. T may be incomplete where handles are only declared. Access is unchecked. Copies on several
/// threads are as safe as the counter of T; one handle object belongs to one thread at a time.
template <typename T>
class KpHandle {
public:
    KpHandle() noexcept = default;
    /// Holds `object`, which may be null.
    KpHandle(T* object) : pointer_(object)
    {
        if (pointer_)
            pointer_->ref();
    }
    /// Holds the same object.
    KpHandle(const KpHandle& other) : KpHandle(other.pointer_) {}
    /// Takes over the reference. `other` becomes null.
    KpHandle(KpHandle&& other) noexcept : pointer_(std::exchange(other.pointer_, nullptr)) {}

    /// Releases the reference. The pointer is cleared first, so that the destructor of the object
    /// does not find a handle to itself here.
    ~KpHandle()
    {
        if (T* const old = std::exchange(pointer_, nullptr))
            old->unref();
    }

    /// Does nothing if the pointer is the same. Otherwise references the new object before it
    /// releases the old one, so that a new object that only the old one holds survives.
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
    /// As the assignment of the pointer.
    // NOLINTNEXTLINE(bugprone-unhandled-self-assignment): the same pointer is left alone
    KpHandle& operator=(const KpHandle& other) { return *this = other.pointer_; }
    /// Releases the old object and takes over the reference of `other`.
    KpHandle& operator=(KpHandle&& other) noexcept
    {
        KpHandle(std::move(other)).swap(*this);
        return *this;
    }

    /// Exchanges the pointers without counting.
    void swap(KpHandle& other) noexcept { std::swap(pointer_, other.pointer_); }

    /// The object or null.
    T* get() const noexcept { return pointer_; }
    /// @{
    /// The object; the handle must not be null, which release builds do not check.
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
    /// @}

    /// Whether there is an object.
    explicit operator bool() const noexcept { return pointer_ != nullptr; }

    /// @{
    /// Whether both point to the same object.
    bool operator==(const KpHandle& other) const noexcept { return pointer_ == other.pointer_; }
    bool operator==(const T* object) const noexcept { return pointer_ == object; }
    /// @}

private:
    T* pointer_ = nullptr;
};

/// Handles of one object are equal.
template <typename T>
struct std::hash<KpHandle<T>> {
    /// That of the address.
    std::size_t operator()(const KpHandle<T>& handle) const { return std::hash<T*>()(handle.get()); }
};
