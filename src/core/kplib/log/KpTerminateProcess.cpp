#include <kplib/log/KpTerminateProcess.h>

#include <csignal>
#include <unistd.h>

void KpTerminateProcess(int status)
{
    kill(getpid(), SIGTERM);
    _exit(status);
}
