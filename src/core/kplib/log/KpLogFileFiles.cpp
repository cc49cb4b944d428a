#include <kplib/log/KpLogFile.h>

#include <kplib/log/detail/KpLogFilePrivate.h>
#include <kplib/system/KpDirectory.h>
#include <kplib/system/KpTmpDir.h>

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <string>
#include <string_view>
#include <unistd.h>
#include <utility>

// Plan
//
// The file of a log. `file` is the descriptor that lines are written to, -1 for none:
//
//     consoleToLogEnabled   file                   descriptors 1 and 2
//     false                 a descriptor above 2   unchanged
//     true                  1                      both lead to the file
//
// open() creates base folder/[year/month/day/]date-time-process.log in this order, so that a
// failure leaves the log as it was:
//
//     open the next file; stop here if that fails
//     close the last one; closeFile() leads 1 and 2 back to the terminal if they led to the file
//     write to the next one: useFile() leads 1 and 2 to it if the flag is set
//     remove the oldest files: cleanUp()
//
// A line that finds the file larger than its limit calls chunkTryOpenNext(), which opens the next
// file and names the last one in its first line. append() continues a file of any name; it neither
// closes a file nor redirects the console.

namespace {

using Lock = KpScopedLockT<KpMutex>;

// Opens for writing with a descriptor above the three standard ones, which a service may have
// closed.
int openAside(const char* path, int mode)
{
    const int first = ::open(path, O_WRONLY | O_CLOEXEC | mode, 0666);
    if (first < 0 || first > STDERR_FILENO)
        return first;
    const int descriptor = fcntl(first, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
    ::close(first);
    return descriptor;
}

// Redirects standard output and standard error to the file of a descriptor, which it closes.
void leadConsoleTo(int descriptor)
{
    std::fflush(stdout);
    std::fflush(stderr);
    dup2(descriptor, STDOUT_FILENO);
    dup2(descriptor, STDERR_FILENO);
    ::close(descriptor);
}

}  // namespace

KpLogFilePrivate::KpLogFilePrivate() : baseFolder(KpTmpDir::getSystemTmpPath())
{
    if (const char* const count = std::getenv("TAMRIN_MAXNUMLOGFILES"))
        maxNumLogFiles = std::atoi(count);
    if (const char* const debug = std::getenv("TAMRIN_DEBUG_LOG"); debug && std::atoi(debug) > 0)
        logLevel = KpLogDebug;
}

bool KpLogFilePrivate::chunkIsFull() const
{
    return file >= 0 && maxLogFileSizeInBytes != 0 && bytesWritten > maxLogFileSizeInBytes;
}

void KpLogFilePrivate::useFile(int descriptor, KpFilename path)
{
    if (consoleToLogEnabled)
        leadConsoleTo(descriptor);
    file = consoleToLogEnabled ? STDOUT_FILENO : descriptor;
    filePath = std::move(path);
    bytesWritten = 0;
    endsInPart = false;
}

void KpLogFilePrivate::closeFile()
{
    if (file < 0)
        return;
    if (consoleToLogEnabled) {
        // Without a terminal, standard output still leads to the file and stays usable.
        if (const int terminal = openAside("/dev/tty", 0); terminal >= 0)
            leadConsoleTo(terminal);
        if (consoleFile)
            std::fclose(consoleFile);
        consoleFile = nullptr;
    }
    if (file != STDOUT_FILENO)
        ::close(file);
    file = -1;
}

// Removes the oldest files: names sort by time. Intentional: if the limit is reached, one file
// less than the limit stays, the open one included. `kept` is the name of a file that is never
// removed.
void KpLogFilePrivate::cleanUp(std::string_view kept) const
{
    if (maxNumLogFiles == 0 || dateFoldersEnabled)
        return;
    KpDArray<KpString> names;
    KpDirectory::scanSortedByName(baseFolder.c_str(), names, "*.log");
    const long excess = names.size() - std::max(maxNumLogFiles, -1L);
    for (long i = 0; i <= excess && i < names.size(); ++i) {
        if (names[i] != kept)
            KpFilename(KpString(0, "%s/%s", baseFolder.c_str(), names[i].c_str())).unlink();
    }
}

bool KpLogFile::open(bool force)
{
    const Lock lock(&record_->mutex);
    if (record_->file >= 0 && !force)
        return false;
    KpString folder, name;
    KpFilename::generateFilePath(folder, name, record_->baseFolder.c_str(), record_->dateFoldersEnabled, false);
    if (folder.isEmpty())
        return false;
    KpFilename path = KpString(0, "%s/%s.log", folder.c_str(), name.c_str());
    // Appends: two files opened within a second have one name, and no line may be lost.
    const int next = openAside(path, O_CREAT | O_APPEND);
    if (next < 0)
        return false;
    record_->closeFile();
    record_->useFile(next, std::move(path));
    // Last, as it may run out of memory. Only for a folder that exists: scanning another one would
    // log an error, and a line into a file that is full calls this function again.
    if (KpDirectory::isDirectory(record_->baseFolder.c_str()))
        record_->cleanUp(record_->filePath.basename());
    return true;
}

void KpLogFile::close()
{
    const Lock lock(&record_->mutex);
    record_->closeFile();
}

bool KpLogFile::append(KpString path)
{
    const Lock lock(&record_->mutex);
    record_->file = openAside(path, O_CREAT | O_APPEND);  // intentional: a file that was open stays open
    const bool isOpen = record_->file >= 0;
    record_->filePath = isOpen ? std::move(path) : KpString();
    record_->bytesWritten = isOpen ? record_->filePath.fileSize() : 0;
    record_->endsInPart = false;
    return isOpen;
}

bool KpLogFile::isOpen() const
{
    const Lock lock(&record_->mutex);
    return record_->file >= 0;
}

KpFilename KpLogFile::filePath() const
{
    const Lock lock(&record_->mutex);
    return record_->filePath;
}

void KpLogFile::setBaseFolder(const std::string& folder)
{
    const Lock lock(&record_->mutex);
    record_->baseFolder = folder.empty() ? KpTmpDir::getSystemTmpPath() : folder;
}

std::string KpLogFile::baseFolder() const
{
    const Lock lock(&record_->mutex);
    return record_->baseFolder;
}

void KpLogFile::setDateFoldersEnabled(bool enabled)
{
    const Lock lock(&record_->mutex);
    record_->dateFoldersEnabled = enabled;
}

bool KpLogFile::dateFoldersEnabled() const
{
    const Lock lock(&record_->mutex);
    return record_->dateFoldersEnabled;
}

void KpLogFile::setMaxNumLogFiles(long count)
{
    const Lock lock(&record_->mutex);
    record_->maxNumLogFiles = count;
}

long KpLogFile::maxNumLogFiles() const
{
    const Lock lock(&record_->mutex);
    return record_->maxNumLogFiles;
}

void KpLogFile::setMaxLogFileSizeInBytes(unsigned long long size)
{
    const Lock lock(&record_->mutex);
    record_->maxLogFileSizeInBytes = size;
}

unsigned long long KpLogFile::maxLogFileSizeInBytes() const
{
    const Lock lock(&record_->mutex);
    return record_->maxLogFileSizeInBytes;
}

bool KpLogFile::chunkIsFull() const
{
    const Lock lock(&record_->mutex);
    return record_->chunkIsFull();
}

void KpLogFile::chunkTryOpenNext()
{
    const Lock lock(&record_->mutex);
    const KpFilename before = record_->filePath;
    if (open(true))
        printf("This file continues %s", before.c_str());
}

void KpLogFile::cleanUp()
{
    const Lock lock(&record_->mutex);
    record_->cleanUp("");
}

// Sets a flag of the console. If a file is open, the log continues in a new one.
void KpLogFile::setConsoleFlag(std::atomic<bool>& flag, bool enabled)
{
    const Lock lock(&record_->mutex);
    if (flag == enabled)
        return;
    const bool wasOpen = record_->file >= 0;
    record_->closeFile();  // with the old value of the flag
    flag = enabled;
    if (wasOpen)
        chunkTryOpenNext();
}

void KpLogFile::setConsoleToLogEnabled(bool enabled)
{
    setConsoleFlag(record_->consoleToLogEnabled, enabled);
}

bool KpLogFile::consoleToLogEnabled() const
{
    return record_->consoleToLogEnabled;
}

void KpLogFile::setLogToConsoleEnabled(bool enabled)
{
    setConsoleFlag(record_->logToConsoleEnabled, enabled);
}

bool KpLogFile::logToConsoleEnabled() const
{
    return record_->logToConsoleEnabled;
}
