#include <support/Bench.h>

#include <kplib/system/KpDirectory.h>
#include <kplib/system/KpTmpDir.h>

#include <algorithm>
#include <dirent.h>
#include <fstream>
#include <string>
#include <vector>

// A folder of a series: ten thousand names, listed in order. The baseline is what the C++ library gives for that.

namespace {

constexpr int count = 10000;

const std::string& folder()
{
    static const KpTmpDir made("/dev/shm/kplib-directory-bench", true, true);
    static const std::string path = [] {
        for (int i = 0; i < count; ++i)
            std::ofstream(made.path().c_str() + std::string("IM") + std::to_string(i * 7919 % count) + ".dcm");
        return std::string(made.path());
    }();
    return path;
}

void readdirAndSort(benchmark::State& state)
{
    folder();
    for (auto _ : state) {
        std::vector<std::string> names;
        DIR* const open = opendir(folder().c_str());
        while (const dirent* entry = readdir(open)) {
            if (entry->d_name[0] != '.')
                names.emplace_back(entry->d_name);
        }
        closedir(open);
        std::sort(names.begin(), names.end());
        benchmark::DoNotOptimize(names.data());
    }
    kplib::bench::report(state, count, 0);
}

void scanSortedByName(benchmark::State& state, const char* pattern)
{
    folder();
    for (auto _ : state) {
        KpDArray<KpString> names;
        if (KpDirectory::scanSortedByName(folder().c_str(), names, pattern, false) != count)
            state.SkipWithError("wrong number of names");
        benchmark::DoNotOptimize(names.data());
    }
    kplib::bench::report(state, count, 0, "readdir", 1.5);
}

}  // namespace

BENCHMARK(readdirAndSort)->Name("readdir");
BENCHMARK_CAPTURE(scanSortedByName, all, nullptr)->Name("KpDirectory/scan");
BENCHMARK_CAPTURE(scanSortedByName, matching, "*.dcm")->Name("KpDirectory/scan *.dcm");
