#include <kplib/log/KpLogFileWriteCallbackDisabler.h>

KpLogFileWriteCallbackDisabler::KpLogFileWriteCallbackDisabler() :
    callback_(getTheLogInstance().writeCallback()), level_(getTheLogInstance().writeCallbackLogLevel())
{
}

void KpLogFileWriteCallbackDisabler::disableWriteCallback()
{
    getTheLogInstance().setWriteCallback(nullptr, KpLogOff);
}

void KpLogFileWriteCallbackDisabler::restoreWriteCallback()
{
    getTheLogInstance().setWriteCallback(callback_, level_);
}
