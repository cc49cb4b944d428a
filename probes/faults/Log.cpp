#include "Calls.h"
#include "Operation.h"

#include <kplib/log/KpLogFile.h>
#include <kplib/system/KpFilename.h>

#include <filesystem>
#include <stdexcept>

namespace kplib::probe {

namespace {

constexpr int lineCount = 4;

std::string line(int number)
{
    return "E [Module] line " + std::to_string(number) + " " + std::string(40, 'x') + "\n";
}

void logLines(KpLogFile& log)
{
    log.setDateTimeFormat(KpLogFile::NoDateTime);
    for (int i = 0; i < lineCount; ++i)
        log.tracef(KpLogError, "Module", "line %d %s", i, std::string(40, 'x').c_str());
}

/// The lines that a log has; nothing if it says that it lost some. Only the last one may be lost without a word.
Outcome linesIn(const std::string& text)
{
    Digest digest;
    bool hasAll = true;
    for (int i = 0; i < lineCount; ++i) {
        const size_t at = text.find(line(i));
        if (at != std::string::npos && at > 0 && text[at - 1] != '\n')
            throw std::runtime_error("a line runs into the next");
        digest << (at != std::string::npos);
        hasAll = hasAll && (at != std::string::npos || i == lineCount - 1);
    }
    if (text.find("could not be written") != std::string::npos)
        return {};
    if (!hasAll)
        throw std::runtime_error("a line is lost without a report");
    return digest;
}

void none()
{
    std::filesystem::remove_all(pathOf("logs"));
    std::filesystem::create_directories(pathOf("logs"));
}

void three()
{
    none();
    for (const char* name : {"logs/20200101-1.log", "logs/20200101-2.log", "logs/20200101-3.log"})
        put(name, "old\n");
}

/// The lines of all files that the log made.
Outcome linesOfFolder()
{
    const Exempt exempt;
    std::string text;
    for (const auto& entry : std::filesystem::directory_iterator(pathOf("logs")))
        text += contentOf(entry.path().string());
    return linesIn(text);
}

Outcome append()
{
    KpLogFile log;
    log.setBaseFolder(pathOf("logs"));
    if (!log.append(pathOf("logs/one.log").c_str()))
        return {};
    logLines(log);
    log.close();
    return linesOfFolder();
}

Outcome open()
{
    KpLogFile log;
    log.setBaseFolder(pathOf("logs"));
    log.setMaxNumLogFiles(2);
    if (!log.open(false))
        return {};
    logLines(log);
    log.close();
    return linesOfFolder();
}

Outcome rollOver()
{
    KpLogFile log;
    log.setBaseFolder(pathOf("logs"));
    log.setMaxLogFileSizeInBytes(20);
    if (!log.open(false))
        return {};
    logLines(log);
    log.close();
    return linesOfFolder();
}

}  // namespace

Operations logOperations()
{
    static constexpr const char* last = "the next line reports a lost one, and there is none after the last";
    static constexpr Operation list[] = {
        {"a log that continues a file", append, none, nullptr, last},
        {"a log that removes old files", open, three, nullptr, last},
        {"a log that goes on in new files", rollOver, none, nullptr, last},
    };
    return list;
}

}  // namespace kplib::probe
