#include <kplib/system/KpCPUInfo.h>
#include <kplib/system/KpOSInfo.h>
#include <kplib/system/KpSysInfo.h>
#include <kplib/system/detail/CpuCounts.h>

#include <cstring>
#include <fstream>
#include <gtest/gtest.h>
#include <set>
#include <sstream>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/utsname.h>
#include <unistd.h>

using namespace kplib::detail;

namespace {

/// The kernel's value of a field of the first processor, such as "flags".
std::string told(const std::string& field)
{
    std::ifstream in("/proc/cpuinfo");
    for (std::string line; std::getline(in, line);) {
        if (line.starts_with(field))
            return line.substr(line.find(':') + 2);
    }
    return "";
}

}  // namespace

TEST(KpCPUInfo, dividesTheTotalsThatDoNotContradictEachOther)
{
    // A -1 is none.
    const std::pair<kplib::platform::ProcessorCounts, CpuCounts> cases[] = {
        {{3, 4, 4}, {3, 1, 1}},    {{2, 16, 32}, {2, 8, 2}},  {{1, 4, 7}, {1, 4, 1}},
        {{1, 4, 3}, {-1, -1, -1}}, {{1, 0, 4}, {-1, -1, -1}}, {{0, 4, 4}, {-1, -1, -1}}};
    for (const auto& [totals, expected] : cases) {
        CpuCounts counts{-1, -1, -1};
        EXPECT_EQ(countsOf(totals, counts), expected.packages > 0);
        EXPECT_EQ(std::memcmp(&counts, &expected, sizeof counts), 0);
    }
}

TEST(KpCPUInfo, agreesWithTheKernel)
{
    kplib::platform::ProcessorCounts counts{};
    const bool isKnown = kplib::platform::processorCounts(counts);
    EXPECT_EQ(counts.logicalProcessors, isKnown ? sysconf(_SC_NPROCESSORS_ONLN) : 0);
    const KpCPUInfo& info = KpCPUInfo::instance();
    if (info.hasCPUID()) {
        EXPECT_EQ(info.vendor(), told("vendor_id"));
        EXPECT_EQ(std::to_string(info.getMaxCPUIDFunc()), told("cpuid level"));
    }
    if (info.cpuInfoSucceed() && !told("cpu cores").empty()) {
        EXPECT_EQ(info.getCoreCount(), std::stoi(told("cpu cores")));
        EXPECT_EQ(info.getLPUCount() * info.getCoreCount(), std::stoi(told("siblings")));
    }
    const std::pair<unsigned, const char*> features[] = {
        {1, "mmx"},   {2, "mmxext"}, {4, "3dnow"},    {8, "3dnowext"},  {16, "sse"},      {32, "sse2"},
        {64, "cmov"}, {512, "pni"},  {1024, "ssse3"}, {2048, "sse4_1"}, {4096, "sse4_2"}, {8192, "avx"}};
    std::istringstream in(told("flags"));
    const std::set<std::string> flags{std::istream_iterator<std::string>(in), {}};
    unsigned expected = 0;
    for (const auto& [bit, flag] : features)
        expected |= flags.count(flag) ? bit : 0;
    EXPECT_EQ(info.detectCPUFeatures(), info.hasCPUID() ? expected : 0);
}

TEST(KpSysInfo, knowsTheMemory)
{
    const auto total = static_cast<unsigned long long>(sysconf(_SC_PHYS_PAGES) * sysconf(_SC_PAGESIZE));
    EXPECT_EQ(KpSysInfo::physmem_total(), total);
    std::uint64_t available = 0;
    ASSERT_TRUE(kplib::platform::availableMemory(available));
    EXPECT_EQ(std::clamp<std::uint64_t>(available, 1 << 20, total), available);
    EXPECT_NEAR(KpSysInfo::physmem_available(), static_cast<double>(std::min(available, 0xFFFFFFFFUL)), 1e8);
}

TEST(KpSysInfo, listsTheProcesses)
{
    char before[16];
    prctl(PR_GET_NAME, before);
    prctl(PR_SET_NAME, "kplib two words");
    KpDArray<KpSysInfo::ProcessEntry> list{{"stale", getpid(), "stale"}};
    EXPECT_TRUE(KpSysInfo::process_list(list));
    prctl(PR_SET_NAME, before);
    std::string ours;
    for (const KpSysInfo::ProcessEntry& entry : list)
        ours += entry.processId == getpid() ? entry.name + "|" + entry.command : "";
    EXPECT_EQ(ours, "kplib|kplib");

    rlimit files{};
    getrlimit(RLIMIT_NOFILE, &files);
    const rlimit none{0, files.rlim_max};
    setrlimit(RLIMIT_NOFILE, &none);
    const bool isListed = KpSysInfo::process_list(list);
    setrlimit(RLIMIT_NOFILE, &files);
    EXPECT_EQ(std::tuple(isListed, list.size()), std::tuple(false, 0));
}

TEST(KpOSInfo, namesTheSystemAndItsVersion)
{
    utsname system{};
    uname(&system);
    const std::string text = system.sysname + std::string(" ") + system.release;
    const size_t end = text.find_first_not_of("0123456789.", text.find(' ') + 1);
    EXPECT_TRUE(std::string(KpOSInfo::getOSName()).starts_with(text.substr(0, end)));
}
