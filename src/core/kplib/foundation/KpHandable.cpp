#include <kplib/foundation/KpHandable.h>

KpHandable::~KpHandable() = default;

void KpHandable::notifyDelete() {}

void KpHandable::unrefLast() const
{
    if (destructionInProgress_) {
        ++refCount_;  // the count was 0 or less and stays so: what unref() took from it was taken in vain
        return;
    }
    destructionInProgress_ = true;
    const_cast<KpHandable*>(this)->notifyDelete();
    destructionNotified_ = true;
    delete this;
}
