#pragma once

#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLogFile.h>

#include <string>
#include <vector>

namespace kplib::test {

using Lines = std::vector<std::string>;

/// Collects the lines of the process's log, such as "E [Dicom] text", and keeps them from the console. One at a time.
class LogCapture {
public:
    explicit LogCapture(KpLogLevel from = KpLogDebug)
    {
        lines().clear();
        set(KpLogOff, KpLogFile::NoDateTime);
        getTheLogInstance().setWriteCallback([](KpLogLevel, const KpString& line) { lines().push_back(line.c_str()); },
                                             from);
    }
    LogCapture(const LogCapture&) = delete;
    LogCapture& operator=(const LogCapture&) = delete;
    ~LogCapture()
    {
        getTheLogInstance().setWriteCallback(nullptr, KpLogOff);
        set(KpLogInfo, KpLogFile::TimeOnly);
    }

    static Lines& lines()
    {
        static Lines collected;
        return collected;
    }

private:
    static void set(KpLogLevel level, KpLogFile::DateTimeFormat format)
    {
        getTheLogInstance().setLogLevel(level);
        getTheLogInstance().setDateTimeFormat(format);
    }
};

}  // namespace kplib::test
