#pragma once

#include <kplib/foundation/KpExport.h>

/// Base of objects that KpHandle counts, for one thread; KpHandableThreaded is for objects that
/// threads share.
///
/// The count is the number of handles, 0 for a new object. An object that no handle ever holds is
/// an ordinary object; one that a handle has held is deleted with its last handle, never by its
/// owner. A copy of an object is an object of its own, with a count of 0. Constant objects are
/// counted too, so that handles may be to const.
class KPLIB_API KpHandable {
public:
    KpHandable() = default;
    /// @{
    /// Leaves the count alone: it belongs to the object, not to its value.
    KpHandable(const KpHandable&) noexcept {}
    KpHandable& operator=(const KpHandable&) noexcept { return *this; }
    /// @}

    virtual ~KpHandable();

    /// Runs once before the object is deleted, while it is whole. It may take and drop handles to the object.
    virtual void notifyDelete();

    /// Counts one handle more.
    void ref() const
    {
        if (!destructionInProgress_)
            ++refCount_;
    }

    /// Deletes the object when the count is no longer positive.
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
