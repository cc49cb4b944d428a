#pragma once

#include <kplib/foundation/KpExport.h>

struct KpThreadLocalStoragePrivate;

/// A slot that holds one pointer for each thread, null at first. Platform failures are silent: a
/// slot that could not be created stays null.
class KPLIB_API KpThreadLocalStorageBase {
public:
    KpThreadLocalStorageBase();
    /// `destructor` is called with a thread's value when the thread ends, unless the value is
    /// null. For the main thread this holds only if it ends through the platform's thread exit.
    explicit KpThreadLocalStorageBase(void (*destructor)(void*));
    KpThreadLocalStorageBase(const KpThreadLocalStorageBase&) = delete;
    KpThreadLocalStorageBase& operator=(const KpThreadLocalStorageBase&) = delete;
    /// Frees the slot. The destructor is not called for values that threads still hold.
    ~KpThreadLocalStorageBase();

    /// This thread's value, null before the first set().
    void* get() const;

    /// Replaces this thread's value; the old one is the caller's to destroy.
    void set(void* value);

private:
    KpThreadLocalStoragePrivate* key_;
};

/// The same for pointers to T. It owns and destroys nothing by itself.
template <typename T>
class KpThreadLocalStorage : public KpThreadLocalStorageBase {
public:
    /// With the constructors of the base.
    using KpThreadLocalStorageBase::KpThreadLocalStorageBase;

    /// This thread's value, null before the first set().
    T* get() const { return static_cast<T*>(KpThreadLocalStorageBase::get()); }
    /// Replaces this thread's value; the old one is the caller's to destroy.
    void set(T* value) { KpThreadLocalStorageBase::set(value); }
};
