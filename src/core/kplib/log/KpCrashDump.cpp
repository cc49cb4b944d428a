#include <kplib/log/KpCrashDump.h>

void* kpCrashDumpConfig()
{
    return nullptr;
}

int kpInitCrashDumpWriter(const char* /*path*/)
{
    return 0;
}

void kpSetReportCrashCmd(const char* /*command*/) {}

int kpEnableProbeDellBackupAndRecoveryCrash(bool /*enable*/)
{
    return 0;
}

void spawnNewClientToUploadCrashDump() {}
