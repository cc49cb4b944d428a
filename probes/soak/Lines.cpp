#include "Soak.h"

#include <kplib/log/KpLogFile.h>

#include <charconv>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <map>
#include <string_view>
#include <thread>

namespace kplib::probe {

namespace {

/// The number after `key` in a line; -1 without one.
long numberAfter(std::string_view line, std::string_view key)
{
    const size_t at = line.find(key);
    long number = -1;
    if (at != std::string_view::npos)
        std::from_chars(line.data() + at + key.size(), line.data() + line.size(), number);
    return number;
}

}  // namespace

void writeLines(int writer, Tally& tally)
{
    const std::string padding(static_cast<size_t>(20 + writer * 7), 'x');
    for (long number = 0; !tally.isOver; ++number) {
        getTheLogInstance().tracef(KpLogInfo, "Soak", "writer=%d line=%ld %s.", writer, number, padding.c_str());
        ++tally.lines;
        if (number % 50 == 0)  // a few megabytes a second are enough
            std::this_thread::sleep_for(std::chrono::milliseconds(80));
    }
}

/// The lines of a writer are in order, within a file and from file to file, so the last number of
/// each writer shows whether all are present.
void checkLines(const std::string& folder, int writers, Tally& tally)
{
    std::map<std::string, std::filesystem::path> files;  // by name, so by time
    for (const auto& entry : std::filesystem::directory_iterator(folder))
        files[entry.path().filename().string()] = entry.path();
    std::map<long, long> next;
    std::uint64_t found = 0;
    for (const auto& [name, path] : files) {
        std::ifstream file(path);
        for (std::string line; std::getline(file, line);) {
            const long writer = numberAfter(line, "writer="), number = numberAfter(line, "line=");
            if (writer < 0 || writer >= writers)
                continue;
            if (!line.ends_with('.') || number != next[writer])
                tally.fault(name + ": line " + std::to_string(next[writer]) + " is missing before: " + line);
            next[writer] = number + 1;
            ++found;
        }
    }
    if (found != tally.lines)
        tally.fault(std::to_string(found) + " of " + std::to_string(tally.lines) + " lines are there");
}

}  // namespace kplib::probe
