#include <kplib/foundation/KpEditable.h>

void KpEditable::startEditing(int flags)
{
    editingFlags_ = flags;
    for (long i = 0; i < listeners_.size(); ++i)  // by index, as a listener may add another
        listeners_[i]->editingStarted(this);
}

void KpEditable::finishEditing()
{
    for (long i = 0; i < listeners_.size(); ++i)
        listeners_[i]->editingFinished(this);
    editingFlags_ = 0;
}

bool KpEditable::isEdited(int mask)
{
    return (editingFlags_ & mask) != 0;
}

bool KpEditable::isAllEdited(int mask)
{
    return (editingFlags_ & mask) == mask;
}

int KpEditable::getEditingFlags() const
{
    return editingFlags_;
}

KpEditable::~KpEditable() = default;

void KpEditable::addEditingListener(KpEditingListener* listener)
{
    listeners_.reserveOne();
    listeners_.append(listener);
}

void KpEditable::removeEditingListener(KpEditingListener* listener)
{
    for (long i = 0; i < listeners_.size(); ++i) {
        if (listeners_[i] == listener) {
            listeners_.remove(i);
            return;
        }
    }
}
