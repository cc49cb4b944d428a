#pragma once

#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLogFile.h>

#include <string>
#include <vector>

namespace kplib::test {

/// Collects the lines of the process's log, such as "E [Dicom] text", and keeps them from the console. One at a time.
class LogCapture {
public:
    explicit LogCapture(KpLogLevel from = KpLogDebug)
    {
        lines().clear();
        getTheLogInstance().setLogLevel(KpLogOff);
        getTheLogInstance().setDateTimeFormat(KpLogFile::NoDateTime);
        getTheLogInstance().setWriteCallback([](KpLogLevel, const KpString& line) { lines().push_back(line.c_str()); },
                                             from);
    }
    LogCapture(const LogCapture&) = delete;
    LogCapture& operator=(const LogCapture&) = delete;
    ~LogCapture()
    {
        getTheLogInstance().setWriteCallback(nullptr, KpLogOff);
        getTheLogInstance().setDateTimeFormat(KpLogFile::TimeOnly);
        getTheLogInstance().setLogLevel(KpLogInfo);
    }

    static std::vector<std::string>& lines()
    {
        static std::vector<std::string> collected;
        return collected;
    }
};

}  // namespace kplib::test
