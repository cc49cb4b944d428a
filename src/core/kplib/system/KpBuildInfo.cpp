#include <kplib/system/KpBuildInfo.h>

#include <kplib/platform/Platform.h>

#include <KpBuildValues.h>
#include <algorithm>
#include <initializer_list>
#include <map>
#include <string>
#include <utility>

namespace {

namespace values = kplib::build;

constexpr int numbers[] = {values::major, values::minor, values::patch, values::build};

// The text with numbers in place of %1%, %2% ... Not by a stream or format, which group digits as the program's locale
// has it.
std::string filled(std::string text, std::initializer_list<int> items)
{
    int place = 1;
    for (const int item : items) {
        const std::string mark = std::string("%").append(std::to_string(place++)).append("%");
        text.replace(text.find(mark), mark.size(), std::to_string(item));
    }
    return text;
}

// Major, minor and patch, with the build number or without.
std::string version(bool hasBuild)
{
    const std::string three = filled("%1%.%2%.%3%", {values::major, values::minor, values::patch});
    return hasBuild ? three + filled(".%1%", {values::build}) : three;
}

const std::map<std::string, std::string>& tags()
{
    static const std::map<std::string, std::string> sTags = {
        {"VERSION_MAJOR", std::to_string(values::major)},
        {"VERSION_MINOR", std::to_string(values::minor)},
        {"VERSION_PATCH", std::to_string(values::patch)},
        {"VERSION_BUILD", std::to_string(values::build)},
        {"VERSION_STRING", version(true)},
        {"VERSION_SHA1", values::revision},
        {"VERSION_PRODUCT_NAME", values::productName},
        {"VERSION_COMMENTS", values::comments},
        {"VERSION_BUILD_TIME", values::time},
        {"VERSION_COPYRIGHT", values::copyright},
        {"VERSION_COMPANY", values::company},
    };
    return sTags;
}

// The text in the brackets of a build string, which may be empty.
std::string details(int flags)
{
    std::string inside;
    const auto add = [&](const char* separator, const std::string& item) {
        if (!inside.empty())
            inside += separator;
        inside += item;
    };
    if (flags & KpBuildInfo::Platform)
        add("", std::string(kplib::platform::name()) + ", 64-bit");
    if (!(flags & KpBuildInfo::BuildNumber))
        add(" ", filled("Build %1%", {values::build}));
    if (const std::string comments = KpBuildInfo::getBuildTag("VERSION_COMMENTS");
        (flags & KpBuildInfo::Comments) && !comments.empty())
        add(" ", "'" + comments + "'");
    if (const std::string time = KpBuildInfo::getBuildTag("VERSION_BUILD_TIME");
        (flags & KpBuildInfo::BuildTime) && !time.empty())
        add(", ", time);
    return inside;
}

}  // namespace

void KpBuildInfo::getVersion(int* v)
{
    std::copy_n(numbers, 4, v);
}

bool KpBuildInfo::isSnapshotBuild()
{
    return values::isSnapshot;
}

std::string KpBuildInfo::getBuildTag(const std::string& key)
{
    const auto found = tags().find(key);
    return found == tags().end() ? std::string() : found->second;
}

std::string KpBuildInfo::getBuildString(int flags)
{
    const std::string text = version((flags & BuildNumber) != 0);
    return flags == BuildNumber ? text : text + " (" + details(flags) + ")";
}
