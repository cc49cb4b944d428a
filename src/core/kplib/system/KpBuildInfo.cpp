#include <kplib/system/KpBuildInfo.h>

#include <kplib/system/platform/Platform.h>

#include <KpBuildValues.h>
#include <boost/format.hpp>
#include <map>

namespace {

namespace values = kplib::build;

std::string text(const char* format, int number)
{
    return (boost::format(format) % number).str();
}

std::string versionString()
{
    return (boost::format("%1%.%2%.%3%.%4%") % values::major % values::minor % values::patch % values::build).str();
}

const std::map<std::string, std::string>& tags()
{
    static const std::map<std::string, std::string> sTags = {
        {"VERSION_MAJOR", std::to_string(values::major)},
        {"VERSION_MINOR", std::to_string(values::minor)},
        {"VERSION_PATCH", std::to_string(values::patch)},
        {"VERSION_BUILD", std::to_string(values::build)},
        {"VERSION_STRING", versionString()},
        {"VERSION_SHA1", values::revision},
        {"VERSION_PRODUCT_NAME", values::productName},
        {"VERSION_COMMENTS", values::comments},
        {"VERSION_BUILD_TIME", values::time},
        {"VERSION_COPYRIGHT", values::copyright},
        {"VERSION_COMPANY", values::company},
    };
    return sTags;
}

/// What stands in the brackets of a build string; it may be nothing.
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
        add(" ", text("Build %1%", values::build));
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
    v[0] = values::major;
    v[1] = values::minor;
    v[2] = values::patch;
    v[3] = values::build;
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
    std::string version = (boost::format("%1%.%2%.%3%") % values::major % values::minor % values::patch).str();
    if (flags & BuildNumber)
        version += text(".%1%", values::build);
    return flags == BuildNumber ? version : version + " (" + details(flags) + ")";
}
