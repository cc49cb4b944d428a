#include <kplib/foundation/KpHandable.h>

KpHandable::~KpHandable() = default;

void KpHandable::notifyDelete() {}

void KpHandable::destroy()
{
    destructionInProgress_ = true;
    notifyDelete();
    destructionNotified_ = true;
    delete this;
}
