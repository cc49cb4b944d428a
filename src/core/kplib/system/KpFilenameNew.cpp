#include <kplib/system/KpFilename.h>
#include <kplib/system/KpTmpDir.h>
#include <kplib/system/KpUUID.h>

#include <atomic>
#include <cstring>
#include <ctime>
#include <initializer_list>
#include <string>
#include <sys/stat.h>
#include <unistd.h>

namespace {

// Whether `path` is a folder, which is made if nothing is there.
bool haveFolder(const KpFilename& path)
{
    return path.doesExist() ? path.isDirectory() : mkdir(path, 0775) == 0;
}

std::tm localTime()
{
    tzset();
    const std::time_t now = std::time(nullptr);
    std::tm local{};
    localtime_r(&now, &local);
    return local;
}

// `root` without slashes at its end, but for a first one.
KpFilename withoutSlashes(const KpString& root)
{
    int length = root.length();
    while (length > 1 && root.c_str()[length - 1] == '/')
        --length;
    return KpString(root.c_str(), 0, length);
}

}  // namespace

void KpFilename::enumerate(KpString& result, const char* pattern, int number)
{
    std::string text(pattern ? pattern : "");
    if (const auto last = text.rfind('#'); last != std::string::npos) {
        const auto before = text.find_last_not_of('#', last);
        const auto first = before == std::string::npos ? 0 : before + 1;
        const int width = static_cast<int>(last + 1 - first);
        text.replace(first, last + 1 - first, KpString(0, "%0*d", width, number).c_str());
    } else if (number >= 2) {
        const auto dot = text.rfind('.');  // intentional: also one in a folder's name
        text.insert(dot == std::string::npos ? text.size() : dot, KpString(0, "%04d", number).c_str());
    }
    result = text.c_str();
}

void KpFilename::makeUnique()
{
    if (!doesExist())
        return;
    const KpString suffix(extension());
    KpFilename stem(*this);
    stem.removeExtension();
    for (int number = 1; doesExist(); ++number)
        *this = stem + KpString(0, ".%d%s", number, suffix.c_str()).c_str();
}

KpFilename KpFilename::getTempFilename(const char* dir)
{
    static std::atomic<unsigned> count = 0;
    KpFilename name(dir ? dir : KpTmpDir::getSystemTmpPath());
    if (dir && *dir)
        name += '/';
    name += KpString(0, "kp.%04d", ++count % 10000);
    name.makeUnique();
    return name;
}

void KpFilename::generateFilePath(KpString& dir, KpString& name, const KpString& root, bool dated, bool withUuid)
{
    KpFilename folder = withoutSlashes(root.isEmpty() ? KpString(KpTmpDir::getSystemTmpPath()) : root);
    dir = "";
    name = "";
    const std::tm now = localTime();
    if (!haveFolder(folder))
        return;
    const int year = now.tm_year + 1900, month = now.tm_mon + 1;
    if (dated) {
        for (const KpString& level :
             {KpString(0, "/%04d", year), KpString(0, "/%02d", month), KpString(0, "/%02d", now.tm_mday)}) {
            folder += level;
            if (!haveFolder(folder))
                return;
        }
    }
    dir = folder;
    name.printf("%04d%02d%02d-%02d%02d%02d-%u", year, month, now.tm_mday, now.tm_hour, now.tm_min, now.tm_sec,
                static_cast<unsigned>(getpid()));
    if (withUuid)
        name = name + '_' + KpUUID::generateUUID().toString();
}
