#include <kplib/system/KpFilename.h>

#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace {

// The result of stat() for a name; all zero if stat() fails.
struct Status : stat {
    explicit Status(const char* name) : stat{}, isKnown(::stat(name, this) == 0) {}
    bool isSameFile(const Status& other) const
    {
        return isKnown && other.isKnown && st_dev == other.st_dev && st_ino == other.st_ino;
    }
    bool isKnown;
};

class Descriptor {
public:
    explicit Descriptor(int number) : number_(number) {}
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;
    ~Descriptor() { close(); }
    operator int() const { return number_; }
    // False if close() reports that something was not written.
    bool close() { return number_ < 0 || ::close(std::exchange(number_, -1)) == 0; }

private:
    int number_;
};

// Repeats the call while signals interrupt it.
template <typename Call>
ssize_t despiteSignals(Call call)
{
    for (;;) {
        const ssize_t n = call();
        if (n >= 0 || errno != EINTR)
            return n;
    }
}

bool writeAll(int file, const char* bytes, ssize_t size)
{
    for (ssize_t done = 0, n = 0; done < size; done += n) {
        n = despiteSignals([&] { return write(file, bytes + done, static_cast<std::size_t>(size - done)); });
        if (n < 1)
            return false;
    }
    return true;
}

bool copyContents(int from, int to)
{
    char buffer[1 << 16];
    for (;;) {
        const ssize_t n = despiteSignals([&] { return read(from, buffer, sizeof buffer); });
        if (n < 1 || !writeAll(to, buffer, n))
            return n == 0;
    }
}

// Removes a partial copy; if a link leads to it, the file is emptied.
void removePart(const char* name)
{
    struct stat status {};
    static_cast<void>(truncate(name, 0) == 0);
    if (lstat(name, &status) == 0 && S_ISREG(status.st_mode))
        unlink(name);
}

}  // namespace

bool KpFilename::doesExist() const
{
    return access(c_str(), F_OK) == 0;
}

bool KpFilename::isReadable() const
{
    return access(c_str(), R_OK) == 0;
}

bool KpFilename::isWriteable() const
{
    return isDirectory() || access(c_str(), W_OK) == 0;
}

bool KpFilename::isDirectory() const
{
    return S_ISDIR(Status(c_str()).st_mode);
}

std::time_t KpFilename::getModTime() const
{
    return Status(c_str()).st_mtime;
}

std::time_t KpFilename::getAccessTime() const
{
    return Status(c_str()).st_atime;
}

std::time_t KpFilename::getCreateTime() const
{
    return Status(c_str()).st_ctime;
}

unsigned long long KpFilename::fileSize() const
{
    const Status status(c_str());
    return status.isKnown ? static_cast<unsigned long long>(status.st_size) : ~0ULL;
}

int KpFilename::getMode() const
{
    const int descriptor = open(c_str(), O_RDONLY | O_CLOEXEC);
    if (descriptor < 0)
        return 0;
    struct stat status {};
    const bool isKnown = fstat(descriptor, &status) == 0;
    close(descriptor);
    return isKnown ? static_cast<int>(status.st_mode) : 0;
}

bool KpFilename::setMode(int mode) const
{
    return chmod(c_str(), static_cast<mode_t>(mode)) == 0;
}

bool KpFilename::create(int mode) const
{
    const int descriptor = creat(c_str(), static_cast<mode_t>(mode));
    return descriptor >= 0 && close(descriptor) == 0;
}

bool KpFilename::unlink() const
{
    return ::unlink(c_str()) == 0;
}

bool KpFilename::rename(const char* newName)
{
    const bool isRenamed = newName && std::rename(c_str(), newName) == 0;
    *this = newName;
    return isRenamed;
}

bool KpFilename::copy(const char* target) const
{
    const Descriptor from(open(c_str(), O_RDONLY | O_CLOEXEC));
    if (from < 0)
        return false;
    if (Status(c_str()).isSameFile(Status(target)))
        return true;  // to open it for writing would lose it
    Descriptor to(target ? open(target, O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666) : -1);
    if (to < 0)
        return false;
    struct stat status {};
    const bool isWhole = copyContents(from, to) && fstat(from, &status) == 0;
    if (isWhole)
        fchmod(to, status.st_mode & 07777);
    if (isWhole && to.close())
        return true;
    removePart(target);
    return false;
}
