#pragma once

#include <kplib/log/KpLogFile.h>

/// Removes the write callback of the process's log and restores it, for code that logs within the
/// callback or must not disturb a user interface.
class KPLIB_API KpLogFileWriteCallbackDisabler {
public:
    /// Stores the current callback and its level; changes nothing.
    KpLogFileWriteCallbackDisabler();
    KpLogFileWriteCallbackDisabler(const KpLogFileWriteCallbackDisabler&) = delete;
    KpLogFileWriteCallbackDisabler& operator=(const KpLogFileWriteCallbackDisabler&) = delete;

    /// Sets no callback and KpLogOff.
    void disableWriteCallback();
    /// Restores the stored callback and level.
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
