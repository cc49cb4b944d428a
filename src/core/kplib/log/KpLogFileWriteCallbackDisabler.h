#pragma once

#include <kplib/log/KpLogFile.h>

/// Turns the write callback of the process's log off and on again, for code that logs from within the callback or must
/// not disturb a user interface.
class KPLIB_API KpLogFileWriteCallbackDisabler {
public:
    /// Only remembers the callback and its level.
    KpLogFileWriteCallbackDisabler();
    KpLogFileWriteCallbackDisabler(const KpLogFileWriteCallbackDisabler&) = delete;
    KpLogFileWriteCallbackDisabler& operator=(const KpLogFileWriteCallbackDisabler&) = delete;

    /// No callback and KpLogOff.
    void disableWriteCallback();
    /// Sets what was remembered.
    void restoreWriteCallback();

private:
    KpLogFile::WriteCallback callback_;
    KpLogLevel level_;
};

/// The same for the length of a scope.
class KPLIB_API KpLogFileScopedWriteCallbackDisabler {
public:
    KpLogFileScopedWriteCallbackDisabler() { disabler_.disableWriteCallback(); }
    ~KpLogFileScopedWriteCallbackDisabler() { disabler_.restoreWriteCallback(); }

private:
    KpLogFileWriteCallbackDisabler disabler_;
};
