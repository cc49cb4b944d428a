#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>

class KpEditable;

/// Receives the changes of a KpEditable. A listener must not remove itself during a call.
class KPLIB_API KpEditingListener {
public:
    /// Called when a change of `object` starts. Its flags are already set.
    virtual void editingStarted(KpEditable* object) = 0;
    /// Called when the change ends. The object still has the flags of the change.
    virtual void editingFinished(KpEditable* object) = 0;

protected:
    ~KpEditingListener() = default;
};

/// An object that announces its changes; flags name what is being changed, and the class of the
/// object defines them. One thread at a time.
class KPLIB_API KpEditable {
public:
    /// Replaces the flags and calls the listeners in the order of their addition.
    virtual void startEditing(int flags);
    /// Calls the listeners in the order of their addition and then clears the flags.
    virtual void finishEditing();
    /// Whether any bit of `mask` is being edited.
    virtual bool isEdited(int mask);
    /// Whether all bits of `mask` are being edited.
    virtual bool isAllEdited(int mask);
    /// All flags of the change, 0 between changes.
    virtual int getEditingFlags() const;
    virtual ~KpEditable();

    /// Adds a listener, which stays the caller's; one that is added twice is called twice.
    void addEditingListener(KpEditingListener* listener);
    /// Removes the first entry of that listener, if there is one.
    void removeEditingListener(KpEditingListener* listener);

private:
    int editingFlags_ = 0;
    KpDArray<KpEditingListener*> listeners_;
};
