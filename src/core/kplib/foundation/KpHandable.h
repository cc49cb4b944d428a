#pragma once

#include <kplib/foundation/KpExport.h>

/// Base of objects whose handles are counted by KpHandle, for use by one thread. Use
/// KpHandableThreaded for objects that threads share.
///
/// The count is the number of handles, 0 for a new object. An object that was never held by a
/// handle is an ordinary object. An object that was held by a handle is deleted with its last
/// handle; its owner must not delete it. A copy of an object is a separate object with a count of
/// 0. Constant objects are counted too, for handles to const.
class KPLIB_API KpHandable {
public:
    KpHandable() = default;
    /// @{
    /// Does not change the count, which belongs to the object and not to its value.
    KpHandable(const KpHandable&) noexcept {}
    KpHandable& operator=(const KpHandable&) noexcept { return *this; }
    /// @}

    virtual ~KpHandable();

    /// Called once before the object is deleted, while it is complete. May take and release
    /// handles to the object.
    virtual void notifyDelete();

    /// Adds one to the count.
    void ref() const
    {
        if (!destructionInProgress_)
            ++refCount_;
    }

    /// Subtracts one from the count, and deletes the object if the count is no longer positive.
    void unref() const
    {
        if (--refCount_ <= 0) [[unlikely]]
            unrefLast();
    }

    /// Number of handles.
    int refCount() const { return refCount_; }

private:
    void unrefLast() const;

    mutable int refCount_ = 0;
    mutable bool destructionInProgress_ = false;  // the count is fixed from then on
    mutable bool destructionNotified_ = false;
};
