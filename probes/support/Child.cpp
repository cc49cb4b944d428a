#include "Child.h"

#include <csignal>
#include <cstdio>
#include <cstring>
#include <new>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

namespace kplib::probe {

void Findings::fail(const char* what)
{
    if (problem[0] == '\0')
        std::snprintf(problem, sizeof problem, "%s (%s)", what, doing);
}

Findings* sharedFindings()
{
    void* const shared = mmap(nullptr, sizeof(Findings), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    return shared == MAP_FAILED ? nullptr : new (shared) Findings;
}

void runInChild(Findings& findings, unsigned seconds, const std::function<void()>& work)
{
    std::memset(static_cast<void*>(&findings), 0, sizeof findings);
    std::fflush(stdout);
    const pid_t child = fork();
    if (child == 0) {
        alarm(seconds);
        work();
        _exit(0);
    }
    int status = 0;
    waitpid(child, &status, 0);
    if (WIFSIGNALED(status))
        findings.fail(WTERMSIG(status) == SIGALRM ? "hangs" : "crashes");
    else if (WEXITSTATUS(status) != 0)
        findings.fail("ends the process");
}

}  // namespace kplib::probe
