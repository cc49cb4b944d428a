#pragma once

#include <kplib/foundation/KpExport.h>

// Entry points of crash reporting, so that callers need no switch for the platform. Here the system's own core dumps
// serve, and these do nothing.

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
