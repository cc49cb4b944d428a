// soak SECONDS FOLDER URL SIZE: lets the log, workers, HTTP ranges and peers work together, and checks that nothing is
// lost and that memory and descriptors do not grow. URL is a file of SIZE bytes made by: soak --file PATH SIZE.

#include "Soak.h"

#include <kplib/log/KpLogFile.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <thread>
#include <unistd.h>
#include <vector>

namespace kplib::probe {

void Tally::fault(const std::string& what)
{
    constexpr int shown = 20;
    if (++faults <= shown)
        std::fprintf(stderr, "     %s\n", what.c_str());
}

}  // namespace kplib::probe

namespace {

using namespace kplib::probe;

constexpr int writers = 32, workers = 4, readers = 4, peers = 4;

/// What the process holds of the system.
struct Holdings {
    long residentKiB = 0, descriptors = 0;

    static Holdings now()
    {
        Holdings held;
        long pages = 0;
        std::ifstream("/proc/self/statm") >> pages >> held.residentKiB;
        held.residentKiB *= sysconf(_SC_PAGESIZE) / 1024;
        held.descriptors = std::distance(std::filesystem::directory_iterator("/proc/self/fd"), {});
        return held;
    }
};

int makeFile(const char* path, std::uint64_t size)
{
    std::string bytes(size, '\0');
    for (std::uint64_t i = 0; i < size; ++i)
        bytes[i] = static_cast<char>(patternAt(i));
    std::ofstream file(path, std::ios::binary);
    return file << bytes && file.flush() ? 0 : 2;
}

void openLog(const std::string& folder)
{
    KpLogFile& log = getTheLogInstance();
    log.setBaseFolder(folder);
    log.setMaxNumLogFiles(0);
    log.setMaxLogFileSizeInBytes(2 << 20);
    if (!log.open(false))
        std::exit(2);
}

std::vector<std::thread> start(const std::string& url, std::uint64_t size, Tally& tally)
{
    std::vector<std::thread> threads;
    for (int i = 0; i < writers; ++i)
        threads.emplace_back([i, &tally] { writeLines(i, tally); });
    for (int i = 0; i < workers; ++i)
        threads.emplace_back([i, &tally] { runWorker(i, tally); });
    for (int i = 0; i < readers; ++i)
        threads.emplace_back([=, &tally] { readRanges(url, size, i, tally); });
    for (int i = 0; i < peers; ++i)
        threads.emplace_back([i, &tally] { exchangeMessages(i, tally); });
    return threads;
}

/// The most that is held at ten moments of a time, so that what comes and goes does not count.
Holdings mostHeld(std::chrono::milliseconds time)
{
    Holdings most;
    for (int i = 0; i < 10; ++i) {
        std::this_thread::sleep_for(time / 10);
        const Holdings held = Holdings::now();
        most.residentKiB = std::max(most.residentKiB, held.residentKiB);
        most.descriptors = std::max(most.descriptors, held.descriptors);
    }
    return most;
}

int passed = 0, failed = 0;

void check(const char* what, bool holds)
{
    ++(holds ? passed : failed);
    std::printf("%s %s\n", holds ? "ok  " : "FAIL", what);
}

}  // namespace

int main(int argc, char** argv)
{
    if (argc == 4 && std::strcmp(argv[1], "--file") == 0)
        return makeFile(argv[2], std::strtoull(argv[3], nullptr, 10));
    if (argc != 5)
        return 2;
    const std::chrono::milliseconds time(1000 * std::strtol(argv[1], nullptr, 10));
    const std::string folder = argv[2];
    Tally tally;
    openLog(folder);
    std::vector<std::thread> threads = start(argv[3], std::strtoull(argv[4], nullptr, 10), tally);
    const Holdings warm = mostHeld(time * 3 / 10);
    std::this_thread::sleep_for(time * 4 / 10);
    const Holdings late = mostHeld(time * 3 / 10);
    tally.isOver = true;
    for (std::thread& thread : threads)
        thread.join();
    getTheLogInstance().close();
    const std::uint64_t faultsOfWork = tally.faults;
    checkLines(folder, writers, tally);

    std::printf("%lu lines, %lu passes, %lu ranges, %lu messages; %ld -> %ld KiB, %ld -> %ld descriptors\n",
                tally.lines.load(), tally.passes.load(), tally.ranges.load(), tally.messages.load(), warm.residentKiB,
                late.residentKiB, warm.descriptors, late.descriptors);
    check("each part has worked", tally.lines > 0 && tally.passes > 0 && tally.ranges > 0 && tally.messages > 0);
    check("passes, ranges and messages are complete", faultsOfWork == 0);
    check("each line stands once in the files", tally.faults == faultsOfWork);
    check("memory does not grow", late.residentKiB <= warm.residentKiB + std::max(2048L, warm.residentKiB / 20));
    check("descriptors do not grow", late.descriptors <= warm.descriptors + 2);
    std::printf("%d passed, %d failed\n", passed, failed);
    return failed > 0 ? 1 : 0;
}
