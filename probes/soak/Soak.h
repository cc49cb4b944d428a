#pragma once

#include <atomic>
#include <cstdint>
#include <string>

namespace kplib::probe {

/// What all parts of the soak count; each adds to it from threads of its own.
struct Tally {
    std::atomic<std::uint64_t> lines = 0, passes = 0, ranges = 0, messages = 0, faults = 0;
    std::atomic<bool> isOver = false;

    /// One fault more, with a line on standard error.
    void fault(const std::string& what);
};

/// Writes numbered lines into the log of the process.
void writeLines(int writer, Tally& tally);
/// Finds every line of the writers once in the files of a folder.
void checkLines(const std::string& folder, int writers, Tally& tally);
/// Lets a worker compute, suspend, cancel and end.
void runWorker(int number, Tally& tally);
/// Reads random ranges of a file, of which byte i is patternAt(i).
void readRanges(const std::string& url, std::uint64_t size, int number, Tally& tally);
/// Sends messages to a peer of this process and compares what comes back.
void exchangeMessages(int number, Tally& tally);

inline unsigned char patternAt(std::uint64_t i)
{
    return static_cast<unsigned char>((i * 2654435761U) >> 24 ^ i);
}

}  // namespace kplib::probe
