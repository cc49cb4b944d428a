#include "Filter.h"

#include <algorithm>
#include <regex>

namespace {

bool isDate(const std::string& bound)
{
    return bound.find('-') != std::string::npos;
}

// How the entry's time compares with all times that begin with `bound`: -1, 0 or 1; `missing` if it has no such time.
int compare(const Entry& entry, const std::string& bound, int missing)
{
    if (entry.time.empty() || (isDate(bound) && entry.date.empty()))
        return missing;
    const std::string time = isDate(bound) ? entry.date + " " + entry.time : entry.time;
    const int order = time.compare(0, bound.size(), bound);
    return order < 0 ? -1 : order > 0;
}

}  // namespace

bool Filter::takes(const Entry& entry) const
{
    if (entry.level < level)
        return false;
    if (!modules.empty() && std::find(modules.begin(), modules.end(), entry.module) == modules.end())
        return false;
    return (since.empty() || compare(entry, since, -1) >= 0) && (until.empty() || compare(entry, until, 1) <= 0);
}

bool Filter::hasDates() const
{
    return isDate(since) || isDate(until);
}

std::string problemOfBound(const std::string& text)
{
    static const std::regex time(R"(\d\d(:\d\d(:\d\d(\.\d{1,3})?)?)?)");
    static const std::regex date(R"(\d{4}-\d\d(-\d\d( \d\d(:\d\d(:\d\d(\.\d{1,3})?)?)?)?)?)");
    if (std::regex_match(text, time) || std::regex_match(text, date))
        return "";
    return "'" + text + "' is no time; give 14:03:59, 2017-03-01 or '2017-03-01 14:03:59'";
}
