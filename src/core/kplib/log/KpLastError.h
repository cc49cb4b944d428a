#pragma once

#include <kplib/log/KpResult.h>

/// Reports failures: to the log, as this thread's last error, and to the notification callbacks.
///
///     if (Tm::fail(load(file)))
///         return false;
namespace Tm {

/// This thread's last error, or a success if there is none. Clears it unless `keep` is true.
KPLIB_API KpResult lastError(bool keep);

/// Replaces this thread's last error by `result`. A success clears it.
KPLIB_API void setError(const KpResult& result);

/// Returns a failure with the code's own text; KP_ERROR expands to this. If `verbose` is true,
/// `function`, `date` and `time` are added to the data, below `data`. If `setLastError` is true,
/// the failure also becomes the last error.
KPLIB_API KpResult tmError(KpResult::Code code, const char* file, unsigned int line, const char* function,
                           const char* date, const char* time, const char* data, bool verbose, bool setLastError);

/// Whether `result` is a failure. A failure is logged, becomes the last error unless there is one
/// already (the first failure stays until lastError() clears it), and is passed to the
/// notification callbacks.
KPLIB_API bool fail(const KpResult& result);

/// The same.
KPLIB_API bool failWin(const KpResult& result);

}  // namespace Tm

/// A failure made at this place in the source, with details for the reader; it becomes the last error.
#define KP_ERROR_DATA(code, data)                                                                                      \
    ::Tm::tmError((code), __FILE__, __LINE__, __func__, __DATE__, __TIME__, (data), true, true)

/// The same without details.
#define KP_ERROR(code) KP_ERROR_DATA(code, nullptr)
