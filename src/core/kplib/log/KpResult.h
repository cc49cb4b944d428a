#pragma once

#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandle.h>
#include <kplib/foundation/KpString.h>

/// The outcome of an operation, one pointer wide.
///
/// A success is a null pointer: it costs nothing to make, copy or test. A failure is a record that all copies share and
/// that never changes; making one writes a debug line to the log. The record is counted for one thread: a failure may
/// go to another thread only when no other copy of it is in use. Hand a result to Tm::fail() (KpLastError.h) to report
/// it.
class KPLIB_API KpResult {
public:
    /// Any number may stand for a failure; those below have texts of their own.
    enum Code : int {
        Ok = 0,
        Failed = 1,
        InternalError = 2,
        DataExpected = 3,
        NotSupported = 4,
        ReadOnly = 5,
        OutOfRange = 6,
        NotImplemented = 7,
        OutOfMemory = 8,
        False = 9,
        Interrupted = 11,
        WriteFileFailed = 12,
        ReadFileFailed = 13,
        InvalidArgument = 17,

        // Reports and snapshots.
        ReportStartFailed = 112,
        ReportWriteFailed = 113,
        SnapshotSaveFailed = 120,

        // OpenGL's own numbers.
        GlInvalidEnum = 1280,
        GlInvalidValue = 1281,
        GlInvalidOperation = 1282,
        GlStackOverflow = 1283,
        GlStackUnderflow = 1284,
        GlOutOfMemory = 1285,

        // 4096 and the classic errno numbers, with the values of Windows.
        SysNoEntry = 4096 + 2,
        SysArgumentListTooLong = 4096 + 7,
        SysExecFormat = 4096 + 8,
        SysBadFile = 4096 + 9,
        SysNoChild = 4096 + 10,
        SysNoMoreProcesses = 4096 + 11,
        SysNoMemory = 4096 + 12,
        SysPermission = 4096 + 13,
        SysBusy = 4096 + 16,
        SysExists = 4096 + 17,
        SysCrossDevice = 4096 + 18,
        SysInvalidArgument = 4096 + 22,
        SysTooManyFiles = 4096 + 24,
        SysNoSpace = 4096 + 28,
        SysMathArgument = 4096 + 33,
        SysResultTooLarge = 4096 + 34,
        SysDeadlock = 4096 + 36,
    };

    class Error;
    /// Receives a failure; true ends the notification, so that no further callback runs.
    using NotificationCallback = bool (*)(const KpResult&);

    KpResult() noexcept = default;

    /// A failure with its texts and perhaps its place in the source; null texts are empty. Without
    /// `data` the code's own text is taken. Code 0 is a success; the texts are ignored.
    KpResult(Code code, const char* text, const char* data);
    /// As above, with the place in the source; `file` may be null.
    KpResult(Code code, int line, const char* file, const char* text, const char* data);
    /// As above, for any number.
    KpResult(int code, const char* text, const char* data);
    /// As above, for any number.
    KpResult(int code, int line, const char* file, const char* text, const char* data);

    /// Whether this is a success.
    bool isOk() const { return !error_; }
    /// Whether this is a failure.
    bool isBad() const { return !isOk(); }

    /// @{
    /// The code of the failure, Ok for a success.
    Code code() const;
    int codeValue() const { return code(); }
    /// @}

    /// 0 when not given.
    int line() const;

    /// The texts of the failure, "" where there is none, never null. Valid as long as a copy of this result.
    const char* file() const;
    /// @{
    /// The texts as above: what the caller gave, and the details.
    const char* text() const;
    const char* data() const;
    /// Whether data() has characters.
    /// @}

    bool hasData() const;

    /// Makes this a success.
    void clear();

    /// Keeps the first failure: takes `other` only when this is a success.
    KpResult& operator<<(const KpResult& other);

    /// Calls the callbacks with a failure, from the last added to the first, until one returns
    /// true.
    void notify() const;

    /// Throws a copy of a failure, as KpResult.
    void throwOnFail() const;

    /// The process-wide list of callbacks. It has no lock: it is set up before threads start.
    static void notificationCallbackAdd(NotificationCallback callback);
    /// Removes the entry of `callback` that was added last, if there is one.
    static void notificationCallbackRemove(NotificationCallback callback);
    /// Removes all callbacks.
    static void notificationCallbackRemoveAll();

private:
    void setError(Code code, int line, const char* file, const char* text, const char* data);

    KpHandle<Error> error_;
};

/// The record of a failure.
class KPLIB_API KpResult::Error : public KpHandable {
public:
    /// Code 0 and empty texts.
    Error() = default;
    /// Fills the record, with the code's own text in place of null or empty `data`, and calls trace().
    Error(Code code, int line, const char* file, const char* text, const char* data);
    ~Error() override;

    /// Writes the record as one debug line.
    void trace() const;

    /// As KpResult::code().
    Code code() const { return static_cast<Code>(code_); }
    /// As KpResult::line().
    int line() const { return line_; }
    /// @{
    /// The texts as KpResult returns them, as strings.
    const KpString& file() const { return file_; }
    const KpString& text() const { return text_; }
    const KpString& data() const { return data_; }
    /// @}
private:
    int code_ = Ok;
    int line_ = 0;
    KpString file_;
    KpString text_;
    KpString data_;
};

inline KpResult::KpResult(Code code, int line, const char* file, const char* text, const char* data)
{
    if (code != Ok)
        setError(code, line, file, text, data);
}

inline KpResult::KpResult(Code code, const char* text, const char* data) : KpResult(code, 0, nullptr, text, data) {}

inline KpResult::KpResult(int code, const char* text, const char* data) : KpResult(static_cast<Code>(code), text, data)
{
}

inline KpResult::KpResult(int code, int line, const char* file, const char* text, const char* data) :
    KpResult(static_cast<Code>(code), line, file, text, data)
{
}

inline void KpResult::clear()
{
    error_ = nullptr;
}

inline KpResult& KpResult::operator<<(const KpResult& other)
{
    if (isOk())
        error_ = other.error_;
    return *this;
}

inline void KpResult::throwOnFail() const
{
    if (isBad())
        throw KpResult(*this);
}

inline KpResult::Code KpResult::code() const
{
    return error_ ? error_->code() : Ok;
}

inline int KpResult::line() const
{
    return error_ ? error_->line() : 0;
}

inline const char* KpResult::file() const
{
    return error_ ? error_->file().c_str() : "";
}

inline const char* KpResult::text() const
{
    return error_ ? error_->text().c_str() : "";
}

inline const char* KpResult::data() const
{
    return error_ ? error_->data().c_str() : "";
}

inline bool KpResult::hasData() const
{
    return error_ && !error_->data().isEmpty();
}
