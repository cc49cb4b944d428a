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

/// The log of the library and of its application. Each message is one line, which is passed to the
/// system before the call returns. getTheLogInstance() returns the log of the process.
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
/// An information line has a blank for its letter.
///
/// Destination: the open file, or standard output if no file is open. The log opens no first file
/// by itself. When the open file has grown beyond its limit, the next line goes to a new file.
///
/// Errors: a line that the open file does not take, as on a full disk, is lost. When writing works
/// again, a warning in the file gives the number of lost lines; the callback does not receive that
/// warning. Exhausted memory throws KpMemoryException and leaves the log usable.
///
/// Threads: any thread may write. Lines are not interleaved.
class KPLIB_API KpLogFile {
public:
    /// How a line shows its time.
    enum DateTimeFormat : int {
        NoDateTime = 0,   ///< no time
        TimeOnly = 1,     ///< 14:03:59.120, or the time since resetTimeStamp()
        DateAndTime = 2,  ///< 2017-03-01 14:03:59.120
    };

    /// Receives each line, with time and header and without an added newline. Runs on the thread
    /// that logs, after the mutex of the log is unlocked; for the first line of a new file the
    /// mutex is still locked.
    ///
    /// The callback may log only if that ends. A line that reaches writeCallbackLogLevel() calls
    /// the callback again. If the limit of setMaxLogFileSizeInBytes() is below the length of a
    /// line, each line opens a new file, whose first line, an information, calls the callback too.
    using WriteCallback = void (*)(KpLogLevel level, const KpString& line);

    KpLogFile();
    KpLogFile(const KpLogFile&) = delete;
    KpLogFile& operator=(const KpLogFile&) = delete;
    /// Closes the file.
    ~KpLogFile();

    /// Returns a new log, owned by the caller.
    static KpLogFile* createInstance();

    /// Logs one line. A null `module` stands for the default module. A message below all
    /// thresholds is still formatted: if that is expensive, check debugEnabled() first.
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

    /// Writes a finished line to the file or the console if `level` reaches logLevel(), with a
    /// newline added if it does not end in one. Passes it unchanged to the callback if `level`
    /// reaches writeCallbackLogLevel().
    void writeLine(KpLogLevel level, const KpString& line);

    /// Writes the text unchanged, whatever the thresholds, to the open file and to the console if
    /// lines are copied there.
    void writeCharBuffer(const char* text);

    /// Flushes standard output, where lines go there. Lines in a file need no flush.
    void flush();

    /// Sets the lowest level that reaches file and console. The default is KpLogInfo.
    void setLogLevel(KpLogLevel level);
    /// See setLogLevel().
    KpLogLevel logLevel() const;

    /// Whether debug messages reach the file, the console or the callback.
    bool debugEnabled() const;

    /// Sets the receiver of each line of `minimumLevel` or above. The defaults are null and
    /// KpLogOff. Takes no lock: call it at start-up.
    void setWriteCallback(WriteCallback callback, KpLogLevel minimumLevel);
    /// The callback or null.
    WriteCallback writeCallback() const;
    /// The lowest level that reaches the callback.
    KpLogLevel writeCallbackLogLevel() const;

    /// Sets how lines show their time. The default is TimeOnly.
    void setDateTimeFormat(DateTimeFormat format);
    /// See setDateTimeFormat().
    DateTimeFormat dateTimeFormat() const;

    /// Sets the module of messages that name none. Null or "" sets no module.
    void setDefaultModule(const char* module);
    /// The default module, or null if there is none. Valid until the next setDefaultModule().
    const char* defaultModule() const;

    /// Sets `out` to the current time as a line shows it in that format.
    void timeString(KpString& out, DateTimeFormat format);

    /// From now on TimeOnly shows the time since this call; hours wrap at 24.
    void resetTimeStamp();

    // Files. A file is named after the time (to the second) and the process. A file of that name
    // that exists is continued.

    /// Opens a new file in the base folder, closes the file that is open, and then removes old
    /// files as cleanUp() does. Returns false, and leaves the log unchanged, if a file is open
    /// already and `force` is false, or if the new file cannot be written.
    bool open(bool force);
    /// Closes the file: lines go to standard output from now on. filePath() stays.
    void close();
    /// Continues in the file `path`, whose size counts for the limit. Returns false, and leaves no
    /// file open, if it cannot be written. A file that was open stays open and unused: call
    /// close() first.
    bool append(KpString path);
    /// Whether lines go to a file.
    bool isOpen() const;
    /// The path of the open file, or of the last one. Empty before the first one.
    KpFilename filePath() const;

    /// Sets the folder of new files. Empty stands for the system's temporary folder. Old logs are
    /// removed from this folder: all names that kpWildMatch() matches with "*.log", also those of
    /// other programs. Names that begin with a dot and names such as x.log.log do not match and
    /// stay.
    void setBaseFolder(const std::string& folder);
    /// See setBaseFolder().
    std::string baseFolder() const;
    /// Sets whether files go into folders by year, month and day. With such folders no old file is
    /// removed.
    void setDateFoldersEnabled(bool enabled);
    /// See setDateFoldersEnabled().
    bool dateFoldersEnabled() const;
    /// Sets the limit on the number of files. The default is 40; 0 is no limit. After open() at
    /// most `count` - 1 files are left, or only the new one if that is more. cleanUp() also leaves
    /// at most `count` - 1.
    void setMaxNumLogFiles(long count);
    /// See setMaxNumLogFiles().
    long maxNumLogFiles() const;
    /// Sets the size in bytes beyond which the next line goes to a new file. The first line of
    /// that file is "This file continues" and the path of the file before. The default is
    /// 50000000; 0 is no limit.
    void setMaxLogFileSizeInBytes(unsigned long long size);
    /// See setMaxLogFileSizeInBytes().
    unsigned long long maxLogFileSizeInBytes() const;

    /// Whether the open file has grown beyond its limit.
    bool chunkIsFull() const;
    /// Continues in a new file, or in the old one if no file can be opened.
    void chunkTryOpenNext();
    /// Removes the oldest files, by name, beyond the limit of setMaxNumLogFiles(). The open file
    /// is not exempt. Does nothing with date folders or without a limit. A base folder that cannot
    /// be read is one error in the log of the process.
    void cleanUp();

    /// Sets whether standard output and standard error go into the file. A change while a file is
    /// open starts a new file. When switched off, both go to the terminal if there is one.
    void setConsoleToLogEnabled(bool enabled);
    /// See setConsoleToLogEnabled().
    bool consoleToLogEnabled() const;
    /// Sets whether lines also go to standard output. A change while a file is open starts a new
    /// file.
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

/// The log of the process. It exists from static initialisation on and is never destroyed, so that
/// static destructors may log.
KPLIB_API KpLogFile& getTheLogInstance();
