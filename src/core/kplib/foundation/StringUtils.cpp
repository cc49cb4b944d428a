#include <kplib/foundation/StringUtils.h>

#include <cstdlib>

namespace {

template <typename Number, typename Convert>
Number convertWhole(const char* s, Number defaultValue, bool* ok, Convert convert)
{
    char* end = nullptr;
    const Number value = s ? convert(s, &end) : defaultValue;
    const bool success = s && end != s && *end == '\0';
    if (ok)
        *ok = success;
    return success ? value : defaultValue;
}

}  // namespace

double StringUtils::toDouble(const char* s, double defaultValue, bool* ok)
{
    return convertWhole(s, defaultValue, ok, std::strtod);
}

long StringUtils::toLong(const char* s, long defaultValue, bool* ok)
{
    return convertWhole(s, defaultValue, ok, [](const char* text, char** end) { return std::strtol(text, end, 0); });
}

unsigned long StringUtils::toULong(const char* s, unsigned long defaultValue, bool* ok)
{
    return convertWhole(s, defaultValue, ok, [](const char* text, char** end) { return std::strtoul(text, end, 0); });
}

bool kpWildMatch(const char* text, const char* pattern)
{
    const char* const start = pattern;
    const char* resume = nullptr;  // after the last run of `*`
    while (*pattern && *text) {
        if (*pattern == '*') {
            while (*pattern == '*')
                ++pattern;
            resume = pattern;
            if (!*pattern)
                break;
        }
        if (*pattern == '?' || *pattern == *text)
            ++pattern;
        else if (!resume)
            return false;
        else
            pattern = resume;  // never moves back in the text
        ++text;
    }
    while (*pattern == '*')
        ++pattern;
    if (*pattern == *text)
        return true;
    if (*pattern || pattern == start)
        return false;
    return pattern[-1] == '*' || pattern[-1] == '?';
}
