#include <kplib/system/KpOSInfo.h>

#include <kplib/platform/Platform.h>

KpString KpOSInfo::getOSName(bool /*ignored*/)
{
    const kplib::platform::Version version = kplib::platform::version();
    return KpString(0, "%s %d.%d.%d", kplib::platform::name(), version.major, version.minor, version.bugFix);
}
