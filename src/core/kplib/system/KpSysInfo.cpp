#include <kplib/system/KpSysInfo.h>

#include <kplib/platform/Platform.h>

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <sstream>
#include <string>

namespace {

struct ClosePipe {
    void operator()(FILE* pipe) const { pclose(pipe); }
};

// Takes a line that begins with a number as it would be printed again, which the heading doesn't.
bool readProcess(const char* line, KpSysInfo::ProcessEntry& entry)
{
    std::istringstream columns(line);
    std::string id, command;
    if (!(columns >> id >> command))
        return false;
    entry.processId = KpString::toInt64(id.c_str());
    entry.name = entry.command = command.c_str();
    return id == std::to_string(entry.processId);
}

}  // namespace

unsigned long long KpSysInfo::physmem_total()
{
    return kplib::platform::totalMemory();
}

unsigned int KpSysInfo::physmem_available()
{
    std::uint64_t bytes = 0;
    if (!kplib::platform::availableMemory(bytes))
        bytes = physmem_total() / 4;
    return static_cast<unsigned int>(std::min<std::uint64_t>(bytes, UINT_MAX));
}

bool KpSysInfo::process_list(KpDArray<ProcessEntry>& list)
{
    list.clear();
    const std::unique_ptr<FILE, ClosePipe> pipe(popen("ps -eo pid,comm", "r"));
    if (!pipe)
        return false;
    constexpr int longest = 65536;
    const auto line = std::make_unique<char[]>(longest);
    ProcessEntry entry;
    while (std::fgets(line.get(), longest, pipe.get())) {
        if (readProcess(line.get(), entry))
            list.append(entry);
    }
    return true;
}
