#include <kplib/log/KpDbC.h>

bool kp_DbC_handleEvents = true;
bool kp_DbC_breakOnEvent = true;

namespace {

DbCCallback sDbC_callback = nullptr;

}  // namespace

DbCCallback kp_DbC_callback()
{
    return sDbC_callback;
}

void kp_DbC_callbackSet(DbCCallback callback)
{
    sDbC_callback = callback;
}
