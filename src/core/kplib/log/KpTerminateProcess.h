#pragma once

#include <kplib/foundation/KpExport.h>

/// Ends this process immediately: by the signal SIGTERM, or with the exit status `status` if that
/// signal is handled or blocked. No exit handler and no static destructor runs.
[[noreturn]] KPLIB_API void KpTerminateProcess(int status);
