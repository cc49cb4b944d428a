#include <kplib/system/KpFilenameCollector.h>

#include <kplib/system/KpDirectory.h>

#include <set>
#include <sys/stat.h>
#include <utility>

namespace {

using Folders = std::set<std::pair<dev_t, ino_t>>;

/// `ancestors`: the folders on the way to `dir`; a link back to one of them would never end.
void collectInto(KpDArray<KpString>& out, const char* pattern, const char* dir, Folders& ancestors)
{
    struct stat status {};
    if (!KpDirectory::isDirectory(dir) || stat(dir, &status) != 0)
        return;
    const auto [self, isNew] = ancestors.emplace(status.st_dev, status.st_ino);
    if (!isNew)
        return;
    const auto pathOf = [dir](const KpString& name) { return KpString(0, "%s/%s", dir, name.c_str()); };
    KpDArray<KpString> names;
    KpDirectory::scanSortedByName(dir, names, pattern, false);
    for (long i = names.size() - 1; i >= 0; --i)
        out.append(pathOf(names[i]));
    names.clear();
    KpDirectory::scanSortedByName(dir, names, "*", false);
    for (long i = names.size() - 1; i >= 0; --i) {
        const KpString path = pathOf(names[i]);
        if (KpDirectory::isDirectory(path))
            collectInto(out, pattern, path, ancestors);
    }
    ancestors.erase(self);
}

}  // namespace

void KpFilenameCollector::collect(KpDArray<KpString>& out, const char* pattern, const char* dir)
{
    Folders ancestors;
    if (pattern && dir)
        collectInto(out, pattern, dir, ancestors);
}
