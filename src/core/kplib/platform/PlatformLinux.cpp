#include <kplib/platform/Platform.h>

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <dirent.h>
#include <fcntl.h>
#include <fstream>
#include <pthread.h>
#include <set>
#include <string>
#include <sys/stat.h>
#include <sys/sysinfo.h>
#include <sys/utsname.h>
#include <unistd.h>

namespace kplib::platform {
namespace {

// Reads the word in a file of a processor's topology; false if the processor is offline.
bool readTopology(long processor, const char* file, std::string& value)
{
    std::ifstream in("/sys/devices/system/cpu/cpu" + std::to_string(processor) + "/topology/" + file);
    return static_cast<bool>(in >> value);
}

}  // namespace

std::uint64_t ticks()
{
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);  // cannot fail for this clock, nor for the other below
    return static_cast<std::uint64_t>(now.tv_sec) * 1'000'000'000u + static_cast<std::uint64_t>(now.tv_nsec);
}

TickRatio tickRatio()
{
    return {1, 1};
}

WallTime wallTime()
{
    timespec now{};
    clock_gettime(CLOCK_REALTIME, &now);
    return {now.tv_sec, static_cast<int>(now.tv_nsec / 1'000'000)};
}

const char* name()
{
    return "Linux";
}

Version version()
{
    utsname system{};
    Version version{0, 0, 0};
    if (uname(&system) == 0)
        std::sscanf(system.release, "%d.%d.%d", &version.major, &version.minor, &version.bugFix);
    return version;
}

bool processorCounts(ProcessorCounts& counts)
{
    std::set<std::string> packages, cores;
    int processors = 0;
    std::string package, core;
    const long configured = sysconf(_SC_NPROCESSORS_CONF);
    for (long i = 0; i < configured; ++i) {
        // The list of its processors identifies a core: the number of the core may occur again in
        // another part of the same package.
        if (!readTopology(i, "physical_package_id", package) || !readTopology(i, "thread_siblings", core))
            continue;
        packages.insert(package);
        cores.insert(core);
        ++processors;
    }
    if (processors == 0)
        return false;
    counts = {static_cast<int>(packages.size()), static_cast<int>(cores.size()), processors};
    return true;
}

std::uint64_t totalMemory()
{
    struct sysinfo info {};
    return sysinfo(&info) == 0 ? static_cast<std::uint64_t>(info.totalram) * info.mem_unit : 0;
}

bool availableMemory(std::uint64_t& bytes)
{
    std::ifstream in("/proc/meminfo");
    for (std::string line; std::getline(in, line);) {
        unsigned long long kibibytes = 0;
        if (std::sscanf(line.c_str(), "MemAvailable: %llu kB", &kibibytes) == 1) {
            bytes = kibibytes * 1024;
            return true;
        }
    }
    return false;
}

bool processMemory(std::int64_t /*process*/, ProcessMemory& /*memory*/)
{
    return false;  // this system has no figures with the same meaning
}

void setThreadName(const char* name)
{
    constexpr size_t room = 15;
    pthread_setname_np(pthread_self(), std::string(name, strnlen(name, room)).c_str());
}

const char* sharedObjectSuffix()
{
    return ".so";
}

bool isFolder(int folder, const dirent& entry)
{
    if (entry.d_type != DT_UNKNOWN)
        return entry.d_type == DT_DIR;
    struct stat status {};
    return fstatat(folder, entry.d_name, &status, AT_SYMLINK_NOFOLLOW) == 0 && S_ISDIR(status.st_mode);
}

}  // namespace kplib::platform
