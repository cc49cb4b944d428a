#pragma once

#include <kplib/foundation/KpExport.h>

// Entry points of crash reporting, present on every platform so that callers need no conditional
// code. On this platform the system writes core dumps, and these functions do nothing.

/// No configuration: null.
KPLIB_API void* kpCrashDumpConfig();
/// 0
KPLIB_API int kpInitCrashDumpWriter(const char* path);
/// Does nothing.
KPLIB_API void kpSetReportCrashCmd(const char* command);
/// 0
KPLIB_API int kpEnableProbeDellBackupAndRecoveryCrash(bool enable);
/// Does nothing.
KPLIB_API void spawnNewClientToUploadCrashDump();
