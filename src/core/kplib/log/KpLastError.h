#pragma once

#include <kplib/log/KpResult.h>

/// Failures made public: the log, this thread's last error, the notification callbacks.
///
///     if (Tm::fail(load(file)))
///         return false;
namespace Tm {

/// This thread's last error, a success when there is none. The call clears it unless `keep` is true.
KPLIB_API KpResult lastError(bool keep);

/// Makes `result` this thread's last error, whatever it was; a success clears it.
KPLIB_API void setError(const KpResult& result);

/// A failure with the code's own text, what KP_ERROR expands to. With `verbose`, `function`, `date` and `time` go into
/// the data, below the given one. With `setLastError` it also becomes the last error.
KPLIB_API KpResult tmError(KpResult::Code code, const char* file, unsigned int line, const char* function,
                           const char* date, const char* time, const char* data, bool verbose, bool setLastError);

/// Whether `result` is a failure. One is logged, becomes the last error unless there is one already (the first failure
/// stays until lastError() takes it), and goes to the notification callbacks.
KPLIB_API bool fail(const KpResult& result);

/// The same.
KPLIB_API bool failWin(const KpResult& result);

}  // namespace Tm

/// A failure made at this place in the source, with details for the reader; it becomes the last error.
#define KP_ERROR_DATA(code, data)                                                                                      \
    ::Tm::tmError((code), __FILE__, __LINE__, __func__, __DATE__, __TIME__, (data), true, true)

/// The same without details.
#define KP_ERROR(code) KP_ERROR_DATA(code, nullptr)
