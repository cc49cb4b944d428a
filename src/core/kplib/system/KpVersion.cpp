#include <kplib/system/KpVersion.h>

#include <cstdint>
#include <initializer_list>
#include <locale>
#include <sstream>

KpVersion::KpVersion(const std::string& text)
{
    std::istringstream in(text);
    in.imbue(std::locale::classic());
    unsigned* const parts[] = {&majorVersion_, &minorVersion_, &patchLevel_, &buildNumber_};
    for (unsigned* part : parts) {
        unsigned value = 0;
        if (!(in >> value)) {
            makeNull();
            return;
        }
        *part = value;
        if (in.eof() || part == &buildNumber_)
            return;
        if (in.get() != '.') {
            makeNull();
            return;
        }
    }
}

bool KpVersion::sameMajorMinor(const KpVersion& other) const
{
    return majorVersion_ == other.majorVersion_ && minorVersion_ == other.minorVersion_;
}

std::pair<unsigned, unsigned> KpVersion::firstMismatchingValues(const KpVersion& other) const
{
    for (unsigned KpVersion::*const part :
         {&KpVersion::majorVersion_, &KpVersion::minorVersion_, &KpVersion::patchLevel_, &KpVersion::buildNumber_}) {
        if (this->*part != other.*part)
            return {this->*part, other.*part};
    }
    return {0, 0};
}

std::string KpVersion::toString() const
{
    return std::to_string(majorVersion_) + '.' + std::to_string(minorVersion_) + '.' + std::to_string(patchLevel_) +
           '.' + std::to_string(buildNumber_);
}

KpVec4i KpVersion::asKpVec4i() const
{
    return {static_cast<std::int32_t>(majorVersion_), static_cast<std::int32_t>(minorVersion_),
            static_cast<std::int32_t>(patchLevel_), static_cast<std::int32_t>(buildNumber_)};
}
