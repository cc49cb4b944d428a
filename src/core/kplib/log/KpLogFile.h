#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>
#include <kplib/log/KpLogLevel.h>

#include <atomic>
#include <string>

struct KpLogFilePrivate;
namespace kplib::detail {
KpLogFilePrivate& logRecord(KpLogFile& log);
}

/// The log: every message of the library is a line here, passed to the system when the call
/// returns. getTheLogInstance() returns it. With no file open, lines go to standard output; the
/// log opens none by itself, but goes on in a new one where one is open and has grown beyond its
/// limit.
///
///     KpLogFile& log = getTheLogInstance();
///     log.setDateTimeFormat(KpLogFile::NoDateTime);
///     log.setDefaultModule("Loader");
///     log.warnf("%d slices are missing", 2);  // prints: W [Loader] 2 slices are missing
///
/// A line is time, ": ", a letter for the level, the module in brackets, a blank and the text:
///
///     14:03:59.120: W [Dicom] text
///
/// An information line has a blank for its letter. Any thread may write; lines don't interleave. A
/// line that the open file does not take, as on a full disk, is lost; when writing works again, a
/// warning in the file says how many were. The callback does not get it. Exhausted memory is an
/// exception, with the log as good as before.
class KPLIB_API KpLogFile {
public:
    /// How a line shows its time.
    enum DateTimeFormat : int {
        NoDateTime = 0,   ///< no time
        TimeOnly = 1,     ///< 14:03:59.120, or the time since resetTimeStamp()
        DateAndTime = 2,  ///< 2017-03-01 14:03:59.120
    };

    /// Receives each line, with time and header and without an added newline. It runs on the
    /// thread that logs, without a lock (under the lock of the log only for the first line of a
    /// new file), and may log itself unless that recurses without end.
    using WriteCallback = void (*)(KpLogLevel level, const KpString& line);

    KpLogFile();
    KpLogFile(const KpLogFile&) = delete;
    KpLogFile& operator=(const KpLogFile&) = delete;
    /// Closes the file.
    ~KpLogFile();

    /// A new log, the caller's to delete.
    static KpLogFile* createInstance();

    /// One line; a null `module` stands for the default module. A message below all thresholds is
    /// still formatted: where that is expensive, check debugEnabled() first.
    void trace(KpLogLevel level, const char* module, const char* text);
    /// As trace(), formatted as by printf().
    void tracef(KpLogLevel level, const char* module, const char* format, ...) KPLIB_PRINTF(4, 5);

    /// Information.
    void print(const char* module, const char* text);
    /// Information in the default module, formatted as by printf().
    void printf(const char* format, ...) KPLIB_PRINTF(2, 3);
    /// @{
    /// Warnings; the formatted one is in the default module.
    void warn(const char* module, const char* text);
    void warnf(const char* format, ...) KPLIB_PRINTF(2, 3);
    /// @}

    /// Errors; the formatted one is in the default module.
    void error(const char* module, const char* text);
    /// As above.
    void errorf(const char* format, ...) KPLIB_PRINTF(2, 3);

    /// A finished line: to file or console if `level` reaches logLevel(), with a newline added if it has none at its
    /// end, and as it is to the callback if `level` reaches writeCallbackLogLevel().
    void writeLine(KpLogLevel level, const KpString& line);

    /// Writes the text unchanged, whatever the thresholds, to the open file and to the console if
    /// lines are copied there.
    void writeCharBuffer(const char* text);

    /// Passes all that was written to the system.
    void flush();

    /// The least level that reaches file and console; KpLogInfo at first.
    void setLogLevel(KpLogLevel level);
    /// See setLogLevel().
    KpLogLevel logLevel() const;

    /// Whether debug messages go anywhere.
    bool debugEnabled() const;

    /// Sets the receiver of each line from `minimumLevel` on; null and KpLogOff at first. Takes no
    /// lock: call it at start-up.
    void setWriteCallback(WriteCallback callback, KpLogLevel minimumLevel);
    /// The callback or null.
    WriteCallback writeCallback() const;
    /// The least level that reaches it.
    KpLogLevel writeCallbackLogLevel() const;

    /// How lines show their time; TimeOnly at first.
    void setDateTimeFormat(DateTimeFormat format);
    /// See setDateTimeFormat().
    DateTimeFormat dateTimeFormat() const;

    /// The module of messages that name none; null or "" for none.
    void setDefaultModule(const char* module);
    /// Null when there is none. Valid until the next setDefaultModule().
    const char* defaultModule() const;

    /// The time now, as the head of a line in that format has it.
    void timeString(KpString& out, DateTimeFormat format);

    /// From now on TimeOnly shows the time since this call; hours wrap at 24.
    void resetTimeStamp();

    // Files. Their names are time (to the second) and process; where such a file is there already it is continued.

    /// Opens a new file in the base folder, closes the one that is open, and then removes old
    /// ones. False if one is open already, unless `force`, or if the new one cannot be written,
    /// which leaves the log as it was.
    bool open(bool force);
    /// Lines go to standard output from now on; filePath() stays.
    void close();
    /// Goes on in the file `path`, whose size counts for the limit; false, with no file open, if
    /// it cannot be written. A file that was open stays open and unused: close() it first.
    bool append(KpString path);
    /// Whether lines go to a file.
    bool isOpen() const;
    /// The file that is open, or was last; empty before the first one.
    KpFilename filePath() const;

    /// Where files are made; empty stands for the system's temporary folder. Old logs are removed from it: all *.log
    /// there.
    void setBaseFolder(const std::string& folder);
    /// See setBaseFolder().
    std::string baseFolder() const;
    /// Whether files are sorted into folders by year, month and day; old ones stay then.
    void setDateFoldersEnabled(bool enabled);
    /// See setDateFoldersEnabled().
    bool dateFoldersEnabled() const;
    /// How many files are kept, 40 at first, of which the one that is opened is the last but one; 0 for all.
    void setMaxNumLogFiles(long count);
    /// See setMaxNumLogFiles().
    long maxNumLogFiles() const;
    /// Beyond how many bytes the next line goes to a new file, which begins with "This file continues" and the path of
    /// the one before; 50000000 at first, 0 for no limit.
    void setMaxLogFileSizeInBytes(unsigned long long size);
    /// See setMaxLogFileSizeInBytes().
    unsigned long long maxLogFileSizeInBytes() const;

    /// Whether the open file is beyond its limit.
    bool chunkIsFull() const;
    /// Continues in a new file; if that cannot be opened, in the old one.
    void chunkTryOpenNext();
    /// Removes the oldest files; no-op with date folders or no limit. A base folder that cannot be read is one error in
    /// the log of the process.
    void cleanUp();

    /// Whether standard output and standard error go into the file; changing it starts a new file. Switched off, they
    /// go to the terminal, if there is one.
    void setConsoleToLogEnabled(bool enabled);
    /// See setConsoleToLogEnabled().
    bool consoleToLogEnabled() const;
    /// Whether lines go to standard output beside the file; changing it starts a new file.
    void setLogToConsoleEnabled(bool enabled);
    /// See setLogToConsoleEnabled().
    bool logToConsoleEnabled() const;

private:
    friend KpLogFilePrivate& kplib::detail::logRecord(KpLogFile& log);

    void write(const KpString& line);  // under the mutex
    void callBack(KpLogLevel level, const KpString& line) const;
    void setConsoleFlag(std::atomic<bool>& flag, bool enabled);

    KpLogFilePrivate* record_;
};

/// The one log of the process. It exists from static initialisation on and is never destroyed, so that static
/// destructors may still log.
KPLIB_API KpLogFile& getTheLogInstance();
