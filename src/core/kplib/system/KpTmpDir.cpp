#include <kplib/system/KpTmpDir.h>

#include <kplib/system/KpDirectory.h>
#include <kplib/system/KpFilename.h>

#include <climits>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <initializer_list>
#include <string_view>
#include <sys/stat.h>

KpTmpDir::KpTmpDir(const char* name, bool createNow, bool removeOnDestruction) :
    removeOnDestruction_(removeOnDestruction)
{
    makeUnique(name);
    if (createNow)
        create(0775);
}

KpTmpDir::~KpTmpDir()
{
    if (removeOnDestruction_)
        remove_dir(path_);
}

void KpTmpDir::makeUnique(const char* name)
{
    if (name)
        path_ = name;
    const std::string_view text = path_;
    const bool isPlaced = text.starts_with('/') || text.starts_with("./");
    const char* const leaf = KpFilename::basename(path_);
    KpString base =
        isPlaced ? KpString(path_, 0, static_cast<int>(leaf - path_.c_str())) : KpString(getSystemTmpPath());
    base += *leaf ? leaf : "tmp";
    KpFilename candidate(base);
    for (int number = 2; candidate.doesExist(); ++number)
        candidate = base + KpString(0, ".%d", number).c_str();
    path_ = candidate + '/';
}

bool KpTmpDir::create(int mode)
{
    return mkdir(path_, static_cast<mode_t>(mode)) == 0 && chmod(path_, static_cast<mode_t>(mode)) == 0;
}

bool KpTmpDir::doesExist() const
{
    return KpFilename(path_).doesExist();
}

int KpTmpDir::remove()
{
    return remove_dir(path_);
}

const char* KpTmpDir::getSystemTmpPath()
{
    // Plain memory: the log calls this before other statics are constructed, others while they are
    // destroyed.
    static thread_local char name[PATH_MAX + 2];
    const char* path = "/tmp";
    for (const char* variable : {"TMPDIR", "TEMP", "TMP"}) {
        if (const char* const set = std::getenv(variable)) {
            path = set;
            break;
        }
    }
    const std::size_t length = strnlen(path, PATH_MAX);
    const bool endsInSlash = length > 0 && path[length - 1] == '/';
    std::snprintf(name, sizeof name, "%.*s%s", PATH_MAX, path, endsInSlash ? "" : "/");
    return name;
}
