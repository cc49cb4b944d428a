#include <kplib/foundation/KpHandable.h>

KpHandable::~KpHandable() = default;

void KpHandable::notifyDelete() {}

void KpHandable::unrefLast() const
{
    if (destructionInProgress_) {
        ++refCount_;  // the count was 0 or less: restores what unref() subtracted
        return;
    }
    destructionInProgress_ = true;
    const_cast<KpHandable*>(this)->notifyDelete();
    destructionNotified_ = true;
    delete this;
}
