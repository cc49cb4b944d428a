#pragma once

#include <kplib/log/KpLogLevel.h>

#include <string>
#include <string_view>
#include <utility>

/// A line of a log, taken apart. Lines without a head belong to the message above them and have its head.
struct Entry {
    std::string file;
    long line = 0;     ///< number in the file, from 1
    std::string date;  ///< 2017-03-01, or empty
    std::string time;  ///< 14:03:59.120, or empty
    KpLogLevel level = KpLogInfo;
    std::string module;
    std::string text;
    bool hasHead = false;
};

/// Takes the lines of one file apart.
class EntryReader {
public:
    explicit EntryReader(std::string file) { entry_.file = std::move(file); }

    /// The next line, without its newline. Valid until the next call.
    const Entry& read(std::string_view line);

private:
    bool readHead(std::string_view line);

    Entry entry_;
};

/// The path of the file that a file with this first line continues; empty if there is none.
std::string continuedFile(std::string_view firstLine);
