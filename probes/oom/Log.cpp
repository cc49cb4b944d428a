#include "Operation.h"

#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLastError.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/log/KpMessageCollector.h>
#include <kplib/log/KpResult.h>
#include <kplib/system/KpFilename.h>
#include <kplib/system/KpTmpDir.h>

#include <memory>
#include <string>

namespace kplib::probe {

namespace {

/// A folder of this process, made on first use in a place that scripts/oom removes.
const char* folder()
{
    static KpTmpDir made("oom-log", true, false);
    return made.path().c_str();
}

Outcome lines()
{
    KpLogFile log;
    const KpFilename path(KpString(folder()) + "lines.log");
    path.unlink();
    if (!log.append(path))
        return {};
    log.setDateTimeFormat(KpLogFile::NoDateTime);
    for (int i = 0; i < 3; ++i)
        log.tracef(KpLogError, "Module", "line %d of a text that takes memory of its own: %0100d", i, i);
    log.flush();
    return Digest() << path.fileSize();
}

Outcome longLine()
{
    KpLogFile log;
    const std::string text(5000, 'x');
    log.setLogLevel(KpLogOff);
    log.setDefaultModule("a module with a name that takes memory of its own");
    log.printf("%s", text.c_str());
    KpString time;
    log.timeString(time, KpLogFile::NoDateTime);
    return Digest() << time << log.defaultModule();
}

Outcome rollOver()
{
    KpLogFile log;
    log.setBaseFolder(folder());
    log.setMaxLogFileSizeInBytes(100);
    log.setMaxNumLogFiles(3);
    if (!log.open(true))
        return {};
    for (int i = 0; i < 8; ++i)
        log.trace(KpLogError, "Module", "a line that fills its file");
    return Digest() << log.isOpen();
}

Outcome openAndClose()
{
    KpLogFile log;
    log.setBaseFolder(folder());
    const bool isOpen = log.open(false);
    const bool isSame = log.filePath().doesExist() && !log.baseFolder().empty();
    log.close();
    if (!isOpen)
        return {};
    return Digest() << isSame << log.isOpen();
}

Outcome instance()
{
    const std::unique_ptr<KpLogFile> log(KpLogFile::createInstance());
    return Digest() << static_cast<int>(log->logLevel());
}

Outcome results()
{
    KpResult result(KpResult::ReadFileFailed, "a text that takes memory of its own", "and data that do so too");
    KpResult first;
    first << result;
    return Digest() << first.codeValue() << first.text() << first.data();
}

Outcome lastError()
{
    const KpResult failure(KpResult::InvalidArgument, "a text that takes memory of its own", "data");
    Tm::fail(failure);
    const KpResult found = Tm::lastError(false);
    return Digest() << found.codeValue() << found.text();
}

Outcome collector()
{
    KpMessageCollector messages;
    for (int i = 0; i < 5; ++i)
        messages.countMessage(messages.addMessageSlot(KpString(0, "message %d of a text of some length", i)));
    KpString report;
    const bool hasReport = messages.generateReport(report, true);
    return Digest() << hasReport << report;
}

}  // namespace

Operations logOperations()
{
    static constexpr Operation list[] = {
        {"lines into a file", lines},     {"a long line", longLine},         {"files that follow each other", rollOver},
        {"open and close", openAndClose}, {"an instance", instance},         {"results", results},
        {"the last error", lastError},    {"collected messages", collector},
    };
    return list;
}

}  // namespace kplib::probe
