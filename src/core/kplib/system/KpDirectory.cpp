#include <kplib/system/KpDirectory.h>

#include <kplib/foundation/StringUtils.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/platform/Platform.h>
#include <kplib/system/KpFilename.h>

#include <algorithm>
#include <cerrno>
#include <climits>
#include <cstring>
#include <ctime>
#include <dirent.h>
#include <memory>
#include <string_view>
#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

namespace {

struct CloseFolder {
    void operator()(DIR* folder) const { closedir(folder); }
};
using Folder = std::unique_ptr<DIR, CloseFolder>;

Folder openFolder(const char* path)
{
    return Folder(path ? opendir(path) : nullptr);
}

bool isWanted(const char* name, const char* pattern)
{
    if (pattern)
        return *name != '.' && kpWildMatch(name, pattern);
    return std::strcmp(name, ".") != 0 && std::strcmp(name, "..") != 0;
}

// Null at the end, with errno 0, or on a failure.
const dirent* nextEntry(const Folder& folder)
{
    errno = 0;
    return readdir(folder.get());
}

// Calls `visit` with the name of each wanted entry and with a function that returns whether it is
// a folder.
template <typename Visit>
bool walk(const char* dir, const char* pattern, Visit visit)
{
    const Folder folder = openFolder(dir);
    if (!folder) {
        getTheLogInstance().errorf("Can't open dir %s\n", dir ? dir : "");
        return false;
    }
    while (const dirent* entry = nextEntry(folder)) {
        if (isWanted(entry->d_name, pattern))
            visit(entry->d_name, [&] { return kplib::platform::isFolder(dirfd(folder.get()), *entry); });
    }
    const int failure = errno;
    if (failure != 0)
        getTheLogInstance().errorf("Can't read dir %s:\n%s\n", dir, std::strerror(failure));
    return failure == 0;
}

KpString pathOf(const char* folder, const KpString& name)
{
    return KpString(0, "%s/%s", folder, name.c_str());
}

unsigned long long since1601(std::time_t seconds)
{
    constexpr unsigned long long unitsPerSecond = 10000000, from1601To1970 = 116444736000000000;
    return static_cast<unsigned long long>(seconds) * unitsPerSecond + from1601To1970;
}

bool copyLink(const char* source, const char* target)
{
    char text[PATH_MAX] = "";
    return readlink(source, text, sizeof(text) - 1) > 0 && symlink(text, target) == 0;
}

// Copies a file, or a link as a link; nothing else, as opening a pipe or a device might block
// forever.
void copyEntry(const KpString& source, const KpString& target)
{
    struct stat status {};
    const bool isKnown = lstat(source, &status) == 0;
    if (isKnown && !S_ISREG(status.st_mode) && !S_ISLNK(status.st_mode))
        getTheLogInstance().errorf("Can't copy %s: not a file, folder or link\n", source.c_str());
    else if (!isKnown || !(S_ISLNK(status.st_mode) ? copyLink(source, target) : KpFilename(source).copy(target)))
        getTheLogInstance().errorf("Can't copy %s\n", source.c_str());
}

// Copies what is in `source` to the folder `target`, which it makes; `newFolder`, the outermost such one, is no part
// of what is copied where it lies within the source.
int copyTree(const char* source, const char* target, const struct stat* newFolder)
{
    KpDArray<KpString> files, folders;
    if (!KpDirectory::scanSortedByName(source, files, folders))
        return -1;
    if (mkdir(target, static_cast<mode_t>(KpFilename(source).getMode()) & 07777) != 0)
        return -1;
    struct stat made {};
    if (!newFolder && stat(target, &made) == 0)
        newFolder = &made;
    for (const KpString& name : files)
        copyEntry(pathOf(source, name), pathOf(target, name));
    for (const KpString& name : folders) {
        struct stat status {};
        const KpString path = pathOf(source, name);
        const bool isNew = newFolder && stat(path, &status) == 0 && status.st_dev == newFolder->st_dev &&
                           status.st_ino == newFolder->st_ino;
        if (!isNew && copyTree(path, pathOf(target, name), newFolder) != 0)
            getTheLogInstance().errorf("Can't copy %s\n", path.c_str());
    }
    return 0;
}

// Whether the path is a link. Trailing slashes, with which the system would follow the link, are
// ignored.
bool isLink(const char* path)
{
    const std::string_view text(path);
    const KpString bare(text.substr(0, text.find_last_not_of('/') + 1));
    struct stat status {};
    return lstat(bare, &status) == 0 && S_ISLNK(status.st_mode);
}

// Logs what cannot be deleted, and passes the result on.
int deleted(int result, const char* path)
{
    if (result != 0)
        getTheLogInstance().errorf("Can't delete %s:\n%s\n", path, std::strerror(errno));
    return result;
}

}  // namespace

long KpDirectory::scanSortedByName(const char* dir, KpDArray<KpString>& names, const char* pattern,
                                   bool onlyDirectories)
{
    const bool isOpen = walk(dir, pattern, [&](const char* name, auto isFolder) {
        if (!onlyDirectories || isFolder())
            names.append(KpString(name));
    });
    if (!isOpen)
        return -1;
    std::sort(names.begin(), names.end());
    return names.size();
}

bool KpDirectory::scanSortedByName(const char* dir, KpDArray<KpString>& files, KpDArray<KpString>& directories,
                                   const char* pattern)
{
    const bool isOpen = walk(dir, pattern, [&](const char* name, auto isFolder) {
        (isFolder() ? directories : files).append(KpString(name));
    });
    if (!isOpen)
        return false;
    std::sort(files.begin(), files.end());
    std::sort(directories.begin(), directories.end());
    return true;
}

long KpDirectory::scan(const char* dir, std::vector<FileInfo>& out, const char* pattern, bool onlyDirectories)
{
    KpDArray<KpString> names;
    scanSortedByName(dir, names, pattern, onlyDirectories);
    out.clear();
    for (const KpString& name : names) {
        struct stat status {};
        if (stat(pathOf(dir, name), &status) == 0)
            out.push_back({name, since1601(status.st_ctime), since1601(status.st_mtime)});
    }
    return static_cast<long>(out.size());
}

long KpDirectory::scanSortedByCreationTime(const char* dir, KpDArray<KpString>& names,
                                           KpDArray<unsigned long long>* times, const char* pattern,
                                           bool onlyDirectories)
{
    std::vector<FileInfo> infos;
    const long count = scan(dir, infos, pattern, onlyDirectories);
    std::sort(infos.begin(), infos.end(),
              [](const FileInfo& a, const FileInfo& b) { return a.creationTime < b.creationTime; });
    names.resize(count);
    if (times)
        times->resize(count);
    for (long i = 0; i < count; ++i) {
        FileInfo& info = infos[static_cast<std::size_t>(i)];
        names[i].swap(info.name);
        if (times)
            (*times)[i] = info.creationTime;
    }
    return count;
}

bool KpDirectory::isDirectory(const char* path)
{
    return openFolder(path) != nullptr;
}

int KpDirectory::copy(const char* source, const char* target)
{
    const KpString newFolder = isDirectory(target) ? pathOf(target, KpFilename::basename(source)) : KpString(target);
    return copyTree(source, newFolder, nullptr);
}

long long KpDirectory::freeSpace(const char* path)
{
    getTheLogInstance().warnf("Free space determination has not been tested under MacX");
    struct statvfs status {};
    if (statvfs(KpFilename(path).dirname(), &status) != 0) {
        getTheLogInstance().errorf("Could not determine free disk space\n");
        return -1;
    }
    return static_cast<long long>(status.f_frsize) * static_cast<long long>(status.f_bavail);
}

int remove_dir(const char* path) noexcept
try {
    if (!KpDirectory::isDirectory(path) || isLink(path))
        return -1;
    KpDArray<KpString> files, folders;
    KpDirectory::scanSortedByName(path, files, folders);
    for (const KpString& name : folders) {
        const KpString folder = pathOf(path, name);
        if (KpDirectory::isDirectory(folder))
            remove_dir(folder);
        else
            deleted(-1, folder);
    }
    for (const KpString& name : files) {
        const KpString file = pathOf(path, name);
        deleted(unlink(file), file);
    }
    return deleted(rmdir(path), path);
} catch (...) {  // out of memory, which a destructor cannot report
    return -1;
}
