#pragma once

#include <kplib/foundation/KpMutex.h>
#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/log/detail/LogClock.h>
#include <kplib/system/KpFilename.h>

#include <atomic>
#include <cstdio>
#include <string>

// The state of a log. The mutex guards all but the atomics, of which those of the level and the
// callback are set during
// start-up.
struct KpLogFilePrivate {
    KpLogFilePrivate();

    // The caller holds the mutex for these.

    // The line of a message.
    KpString formatLine(KpLogLevel level, const char* module, const char* text);
    // Writes the text, with a newline unless it ends in one.
    void write(std::string_view line);
    // False if the open file does not take the whole text and its ending, which counts as a lost
    // line.
    bool writeToFile(int destination, std::string_view text, std::string_view ending);
    void reportLostLines();
    void flush() const;
    std::string_view timeText(KpLogFile::DateTimeFormat format);
    bool chunkIsFull() const;
    // Continues in the file of `descriptor`; the log must have no open file.
    void useFile(int descriptor, KpFilename path);
    void closeFile();
    void cleanUp(std::string_view kept) const;

    KpMutex mutex{true};
    std::string baseFolder;
    bool dateFoldersEnabled = false;
    int file = -1;  // descriptor; that of standard output if the console leads to the file
    FILE* consoleFile = nullptr;
    KpFilename filePath;
    long maxNumLogFiles = 40;
    unsigned long long maxLogFileSizeInBytes = 50000000;
    std::atomic<KpLogFile::WriteCallback> writeCallback = nullptr;
    std::atomic<KpLogLevel> logLevel = KpLogInfo;
    std::atomic<KpLogLevel> writeCallbackLogLevel = KpLogOff;
    std::atomic<bool> consoleToLogEnabled = false;
    std::atomic<bool> logToConsoleEnabled = false;
    KpLogFile::DateTimeFormat dateTimeFormat = KpLogFile::TimeOnly;
    KpString defaultModule;
    unsigned long long bytesWritten = 0;
    long linesLost = 0;       // not reported yet
    int causeOfLoss = 0;      // code of the last failed write
    bool endsInPart = false;  // the file ends in the first part of a lost line
    bool timeStampSet = false;
    kplib::platform::WallTime timeStamp{};

    kplib::detail::LogClock clock;
};

namespace kplib::detail {

// The record of a log, for what opens its file.
KpLogFilePrivate& logRecord(KpLogFile& log);

}  // namespace kplib::detail
