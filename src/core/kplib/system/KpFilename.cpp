#include <kplib/system/KpFilename.h>

#include <cstdio>
#include <fcntl.h>
#include <memory>
#include <sys/stat.h>
#include <unistd.h>

namespace {

// What stat() tells of a name; all zero where it fails.
struct Status : stat {
    explicit Status(const char* name) : stat{}, isKnown(::stat(name, this) == 0) {}
    bool isSameFile(const Status& other) const
    {
        return isKnown && other.isKnown && st_dev == other.st_dev && st_ino == other.st_ino;
    }
    bool isKnown;
};

struct CloseFile {
    void operator()(FILE* file) const { std::fclose(file); }
};
using File = std::unique_ptr<FILE, CloseFile>;

void copyContents(FILE* from, FILE* to)
{
    char buffer[4096];
    std::size_t count = 0;
    do {
        count = std::fread(buffer, 1, sizeof buffer, from);
        std::fwrite(buffer, 1, count, to);
    } while (count == sizeof buffer);
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
    const File from(std::fopen(c_str(), "rbe"));
    if (!from)
        return false;
    if (Status(c_str()).isSameFile(Status(target)))
        return true;  // to open it for writing would lose it
    File to(std::fopen(target, "wbe"));
    if (!to)
        return false;
    copyContents(from.get(), to.get());
    to.reset();
    KpFilename(target).setMode(getMode());
    return true;
}
