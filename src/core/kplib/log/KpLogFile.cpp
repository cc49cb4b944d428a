#include <kplib/log/KpLogFile.h>

#include <kplib/foundation/KpString.h>
#include <kplib/log/detail/KpLogFilePrivate.h>

#include <algorithm>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <initializer_list>
#include <string_view>
#include <sys/uio.h>
#include <unistd.h>

namespace {

using Lock = KpScopedLockT<KpMutex>;

// The first message creates the log; this creates it at the latest.
[[maybe_unused]] KpLogFile* const s_theLogInstance = &getTheLogInstance();

KpString joined(std::initializer_list<std::string_view> pieces)
{
    long size = 1;
    for (std::string_view piece : pieces)
        size += static_cast<long>(piece.size());
    KpString text{KpString::NoMemory()};
    text.resize(size);
    char* to = text.data();
    for (std::string_view piece : pieces)
        to += piece.copy(to, piece.size());
    *to = '\0';
    return text;
}

const char* levelField(KpLogLevel level)
{
    const char* const letter = KpLogLevelToString(level);
    return level == KpLogInfo || !*letter ? " " : letter;
}

void traceFormatted(KpLogFile& log, KpLogLevel level, const char* module, const char* format, va_list args)
{
    KpString text{KpString::NoMemory()};
    text.vprintf(format, args);
    log.trace(level, module, text);
}

// Writes both texts, in one call if the system accepts all bytes; continues after a signal and
// after a part. Returns the number of bytes written, with the cause in errno if some are missing.
std::size_t writeAll(int file, std::string_view text, std::string_view ending)
{
    std::size_t done = 0;
    while (done < text.size() + ending.size()) {
        const std::string_view head = text.substr(std::min(done, text.size()));
        const std::string_view tail = ending.substr(done - (text.size() - head.size()));
        const iovec pieces[] = {{const_cast<char*>(head.data()), head.size()},
                                {const_cast<char*>(tail.data()), tail.size()}};
        const ssize_t n = writev(file, pieces, 2);
        if (n > 0)
            done += static_cast<std::size_t>(n);
        else if (n == 0 || errno != EINTR)
            break;
    }
    return done;
}

// In one piece, and in order with other writers to the stream of standard output.
std::size_t put(int destination, std::string_view text, std::string_view ending)
{
    if (destination != STDOUT_FILENO)
        return writeAll(destination, text, ending);
    flockfile(stdout);
    std::fflush(stdout);
    const std::size_t done = writeAll(destination, text, ending);
    funlockfile(stdout);
    return done;
}

}  // namespace

KpString KpLogFilePrivate::formatLine(KpLogLevel level, const char* module, const char* text)
{
    const std::string_view time = timeText(dateTimeFormat);
    return joined({time, time.empty() ? "" : ": ", levelField(level), " [", module ? module : defaultModule.c_str(),
                   "] ", text ? text : ""});
}

void KpLogFilePrivate::write(std::string_view line)
{
    reportLostLines();
    const std::string_view ending = line.ends_with('\n') ? "" : "\n";
    const int destination = file >= 0 && !consoleToLogEnabled ? file : STDOUT_FILENO;
    writeToFile(destination, line, ending);
    bytesWritten += line.size() + ending.size();
    if (destination != STDOUT_FILENO && logToConsoleEnabled)
        put(STDOUT_FILENO, line, ending);
}

bool KpLogFilePrivate::writeToFile(int destination, std::string_view text, std::string_view ending)
{
    const std::size_t done = put(destination, text, ending);
    if (file < 0 || done == text.size() + ending.size())
        return true;
    causeOfLoss = errno;
    ++linesLost;
    endsInPart = endsInPart || done > 0;
    return false;
}

// Writes one line with the number of lost lines. Repeated before each line until the file accepts
// it, but not at the start of a file, which names the file before.
void KpLogFilePrivate::reportLostLines()
{
    if (file < 0 || linesLost == 0 || bytesWritten == 0)
        return;
    const KpString text(0, "%ld lines could not be written: %s", linesLost, std::strerror(causeOfLoss));
    const KpString line = joined({endsInPart ? "\n" : "", formatLine(KpLogWarning, nullptr, text), "\n"});
    if (!writeToFile(consoleToLogEnabled ? STDOUT_FILENO : file, line, "")) {
        --linesLost;  // the report is no line of a caller
        return;
    }
    linesLost = 0;
    endsInPart = false;
    bytesWritten += static_cast<unsigned long long>(line.length());
}

void KpLogFilePrivate::flush() const
{
    if (file < 0 || consoleToLogEnabled || logToConsoleEnabled)
        std::fflush(stdout);
}

std::string_view KpLogFilePrivate::timeText(KpLogFile::DateTimeFormat format)
{
    if (format != KpLogFile::TimeOnly && format != KpLogFile::DateAndTime)
        return {};
    const kplib::platform::WallTime now = kplib::platform::wallTime();
    if (format == KpLogFile::TimeOnly && timeStampSet)
        return clock.elapsed(timeStamp, now);
    std::string_view text = clock.dateAndTime(now);
    if (format == KpLogFile::TimeOnly)
        text.remove_prefix(text.find(' ') + 1);
    return text;
}

KpLogFilePrivate& kplib::detail::logRecord(KpLogFile& log)
{
    return *log.record_;
}

KpLogFile& getTheLogInstance()
{
    static KpLogFile* const log = KpLogFile::createInstance();
    return *log;
}

KpLogFile::KpLogFile() : record_(new KpLogFilePrivate) {}

KpLogFile::~KpLogFile()
{
    record_->closeFile();
    delete record_;
}

KpLogFile* KpLogFile::createInstance()
{
    kpSetLockFailureReport([](const char* format, int errorCode) { getTheLogInstance().errorf(format, errorCode); });
    return new KpLogFile;
}

void KpLogFile::trace(KpLogLevel level, const char* module, const char* text)
{
    KpString line{KpString::NoMemory()};
    {
        const Lock lock(&record_->mutex);
        line = record_->formatLine(level, module, text);
        if (record_->logLevel <= level)
            write(line);
    }
    callBack(level, line);
}

void KpLogFile::tracef(KpLogLevel level, const char* module, const char* format, ...)
{
    va_list args;
    va_start(args, format);
    traceFormatted(*this, level, module, format, args);
    va_end(args);
}

void KpLogFile::printf(const char* format, ...)
{
    va_list args;
    va_start(args, format);
    traceFormatted(*this, KpLogInfo, nullptr, format, args);
    va_end(args);
}

void KpLogFile::warnf(const char* format, ...)
{
    va_list args;
    va_start(args, format);
    traceFormatted(*this, KpLogWarning, nullptr, format, args);
    va_end(args);
}

void KpLogFile::errorf(const char* format, ...)
{
    va_list args;
    va_start(args, format);
    traceFormatted(*this, KpLogError, nullptr, format, args);
    va_end(args);
}

void KpLogFile::print(const char* module, const char* text)
{
    trace(KpLogInfo, module, text);
}

void KpLogFile::warn(const char* module, const char* text)
{
    trace(KpLogWarning, module, text);
}

void KpLogFile::error(const char* module, const char* text)
{
    trace(KpLogError, module, text);
}

void KpLogFile::writeLine(KpLogLevel level, const KpString& line)
{
    if (record_->logLevel <= level) {
        const Lock lock(&record_->mutex);
        write(line);
    }
    callBack(level, line);
}

void KpLogFile::write(const KpString& line)
{
    if (record_->chunkIsFull())
        chunkTryOpenNext();
    record_->write(line);
}

void KpLogFile::callBack(KpLogLevel level, const KpString& line) const
{
    const WriteCallback callback = record_->writeCallback;
    if (callback && record_->writeCallbackLogLevel <= level)
        callback(level, line);
}

void KpLogFile::writeCharBuffer(const char* text)
{
    const Lock lock(&record_->mutex);
    const std::string_view bytes = text ? text : "";
    if (record_->file >= 0) {
        record_->writeToFile(record_->file, bytes, "");
        record_->bytesWritten += bytes.size();
    }
    if (record_->logToConsoleEnabled)
        put(STDOUT_FILENO, bytes, "");
}

void KpLogFile::flush()
{
    const Lock lock(&record_->mutex);
    record_->flush();
}

void KpLogFile::setLogLevel(KpLogLevel level)
{
    record_->logLevel = level;
}

KpLogLevel KpLogFile::logLevel() const
{
    return record_->logLevel;
}

bool KpLogFile::debugEnabled() const
{
    return record_->logLevel == KpLogDebug || record_->writeCallbackLogLevel == KpLogDebug;
}

void KpLogFile::setWriteCallback(WriteCallback callback, KpLogLevel minimumLevel)
{
    record_->writeCallback = callback;
    record_->writeCallbackLogLevel = minimumLevel;
}

KpLogFile::WriteCallback KpLogFile::writeCallback() const
{
    return record_->writeCallback;
}

KpLogLevel KpLogFile::writeCallbackLogLevel() const
{
    return record_->writeCallbackLogLevel;
}

void KpLogFile::setDateTimeFormat(DateTimeFormat format)
{
    const Lock lock(&record_->mutex);
    record_->dateTimeFormat = format;
}

KpLogFile::DateTimeFormat KpLogFile::dateTimeFormat() const
{
    const Lock lock(&record_->mutex);
    return record_->dateTimeFormat;
}

void KpLogFile::setDefaultModule(const char* module)
{
    const Lock lock(&record_->mutex);
    record_->defaultModule = module;
}

const char* KpLogFile::defaultModule() const
{
    const Lock lock(&record_->mutex);
    return record_->defaultModule.isEmpty() ? nullptr : record_->defaultModule.c_str();
}

void KpLogFile::timeString(KpString& out, DateTimeFormat format)
{
    const Lock lock(&record_->mutex);
    out = joined({record_->timeText(format)});
}

void KpLogFile::resetTimeStamp()
{
    const Lock lock(&record_->mutex);
    record_->timeStamp = kplib::platform::wallTime();
    record_->timeStampSet = true;
}
