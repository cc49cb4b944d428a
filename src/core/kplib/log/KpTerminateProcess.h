#pragma once

#include <kplib/foundation/KpExport.h>

/// Ends this process at once: signal SIGTERM, and where that is handled or blocked, the exit status `status`. No exit
/// handler and no static destructor runs.
[[noreturn]] KPLIB_API void KpTerminateProcess(int status);
