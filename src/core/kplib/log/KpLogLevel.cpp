#include <kplib/log/KpLogLevel.h>

namespace {

constexpr const char* letters[] = {"D", "I", "W", "E", "C"};
constexpr int levelCount = sizeof letters / sizeof *letters;

}  // namespace

const char* KpLogLevelToString(KpLogLevel level)
{
    return level >= 0 && level < levelCount ? letters[level] : "";
}

KpLogLevel KpLogLevelFromString(const char* s, bool* ok)
{
    int level = 0;
    while (level < levelCount && !(s && *s == *letters[level]))
        ++level;
    if (ok)
        *ok = level < levelCount;
    return level < levelCount ? static_cast<KpLogLevel>(level) : KpLogCritical;
}
