#pragma once

#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandle.h>
#include <kplib/foundation/KpString.h>

/// The outcome of an operation, one pointer wide.
///
/// A success is a null pointer: constructing, copying and testing it costs nothing. A failure is
/// an immutable record that all copies share; constructing one writes a debug line to the log. The
/// count of copies is for one thread: a failure may be passed to another thread only if no other
/// copy of it is in use. Pass a result to Tm::fail() (KpLastError.h) to report it.
class KPLIB_API KpResult {
public:
    /// Any number may stand for a failure; those below have texts of their own.
    enum Code : int {
        Ok = 0,                ///< success
        Failed = 1,            ///< a failure without a cause of its own
        InternalError = 2,     ///< a fault of the program
        DataExpected = 3,      ///< data are missing
        NotSupported = 4,      ///< the request is not supported
        ReadOnly = 5,          ///< the object cannot be changed
        OutOfRange = 6,        ///< an index or a value is out of range
        NotImplemented = 7,    ///< the operation has no implementation
        OutOfMemory = 8,       ///< memory is exhausted
        False = 9,             ///< a negative answer
        Interrupted = 11,      ///< canceled by the user
        WriteFileFailed = 12,  ///< a file could not be written
        ReadFileFailed = 13,   ///< a file could not be read
        InvalidArgument = 17,  ///< an argument is invalid

        // Reports and snapshots.
        ReportStartFailed = 112,   ///< the word processor could not be started
        ReportWriteFailed = 113,   ///< a report could not be written
        SnapshotSaveFailed = 120,  ///< a picture could not be saved

        // OpenGL's own numbers.
        GlInvalidEnum = 1280,       ///< GL_INVALID_ENUM
        GlInvalidValue = 1281,      ///< GL_INVALID_VALUE
        GlInvalidOperation = 1282,  ///< GL_INVALID_OPERATION
        GlStackOverflow = 1283,     ///< GL_STACK_OVERFLOW
        GlStackUnderflow = 1284,    ///< GL_STACK_UNDERFLOW
        GlOutOfMemory = 1285,       ///< GL_OUT_OF_MEMORY

        // 4096 and the classic errno numbers, with the values of Windows.
        SysNoEntry = 4096 + 2,              ///< ENOENT
        SysArgumentListTooLong = 4096 + 7,  ///< E2BIG
        SysExecFormat = 4096 + 8,           ///< ENOEXEC
        SysBadFile = 4096 + 9,              ///< EBADF
        SysNoChild = 4096 + 10,             ///< ECHILD
        SysNoMoreProcesses = 4096 + 11,     ///< EAGAIN
        SysNoMemory = 4096 + 12,            ///< ENOMEM
        SysPermission = 4096 + 13,          ///< EACCES
        SysBusy = 4096 + 16,                ///< EBUSY
        SysExists = 4096 + 17,              ///< EEXIST
        SysCrossDevice = 4096 + 18,         ///< EXDEV
        SysInvalidArgument = 4096 + 22,     ///< EINVAL
        SysTooManyFiles = 4096 + 24,        ///< EMFILE
        SysNoSpace = 4096 + 28,             ///< ENOSPC
        SysMathArgument = 4096 + 33,        ///< EDOM
        SysResultTooLarge = 4096 + 34,      ///< ERANGE
        SysDeadlock = 4096 + 36,            ///< EDEADLK
    };

    class Error;
    /// Receives a failure; true ends the notification, so that no further callback runs.
    using NotificationCallback = bool (*)(const KpResult&);

    KpResult() noexcept = default;

    /// A failure with its texts; null texts are empty. Without `data` the code's own text is used.
    /// Code 0 is a success, and the texts are ignored.
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
    /// @}

    /// Whether data() has characters.
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

    /// Adds a callback to the process-wide list. The list has no lock: set it up before other
    /// threads start.
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
