#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>

class KpEditable;

/// Hears of changes. It must not remove itself while it is called.
class KPLIB_API KpEditingListener {
public:
    virtual void editingStarted(KpEditable* object) = 0;
    /// The object still has the flags of the change.
    virtual void editingFinished(KpEditable* object) = 0;

protected:
    ~KpEditingListener() = default;
};

/// An object that announces its changes; flags tell what is being changed, and their meaning is the object's own. One
/// thread at a time.
class KPLIB_API KpEditable {
public:
    /// Sets the flags, in place of what was there, and tells the listeners, first to last.
    virtual void startEditing(int flags);
    /// Tells the listeners, first to last, and then clears the flags.
    virtual void finishEditing();
    /// Whether any bit of `mask` is being edited.
    virtual bool isEdited(int mask);
    /// Whether all bits of `mask` are being edited.
    virtual bool isAllEdited(int mask);
    virtual int getEditingFlags() const;
    virtual ~KpEditable();

    /// Adds a listener, which stays the caller's; one that is added twice is told twice.
    void addEditingListener(KpEditingListener* listener);
    /// Removes the first entry of that listener, if there is one.
    void removeEditingListener(KpEditingListener* listener);

private:
    int editingFlags_ = 0;
    KpDArray<KpEditingListener*> listeners_;
};
