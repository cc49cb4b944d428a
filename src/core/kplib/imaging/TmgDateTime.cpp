#include <kplib/imaging/TmgDateTime.h>

#include <algorithm>
#include <array>
#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <ctime>

namespace {

Tmg::DateReformatLong funcDateReformatLong = Tmg::dateReformatLong_default;
Tmg::DateReformatString funcDateReformatString = Tmg::dateReformatString_default;

constexpr std::array<const char*, 12> months = {"-JAN-", "-FEB-", "-MAR-", "-APR-", "-MAY-", "-JUN-",
                                                "-JUL-", "-AUG-", "-SEP-", "-OCT-", "-NOV-", "-DEC-"};

// As atoi(), also for numbers that no int holds.
int number(const std::string& digits)
{
    return static_cast<int>(std::strtol(digits.c_str(), nullptr, 10));
}

// `value` by "%0*d".
std::string padded(int width, long long value)
{
    char text[32];
    std::snprintf(text, sizeof text, "%0*d", width, static_cast<int>(value));
    return text;
}

// The digits of a number after its first one, a 1 that keeps leading zeros.
std::string withoutFirst(int value)
{
    return std::to_string(value).substr(1);
}

}  // namespace

namespace Tmg {

void SetFuncDateReformatLong(DateReformatLong function)
{
    funcDateReformatLong = function ? function : dateReformatLong_default;
}

void SetFuncDateReformatString(DateReformatString function)
{
    funcDateReformatString = function ? function : dateReformatString_default;
}

std::string dateReformat(long yyyymmdd)
{
    return funcDateReformatLong(yyyymmdd);
}

long dateReformat(const std::string& text)
{
    return funcDateReformatString(text);
}

std::string dateReformatLong_default(long yyyymmdd)
{
    std::string text = std::to_string(yyyymmdd);
    if (text.size() < 8)
        return {};
    const int month = number(text.substr(4, 2));
    return text.replace(4, 2, months[month >= 1 && month <= 11 ? static_cast<size_t>(month - 1) : 11]);
}

long dateReformatString_default(const std::string& text)
{
    if (text.size() < 9)
        return std::atol(text.c_str());
    std::string upper = text.substr(4, 5);
    std::transform(upper.begin(), upper.end(), upper.begin(),
                   [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
    const auto* const month = std::find(months.begin(), months.end(), upper);
    if (month == months.end())
        return 0;
    return std::atol((text.substr(0, 4) + padded(2, month - months.begin() + 1) + text.substr(9, 2)).c_str());
}

std::string timeReformat(const char* time)
{
    std::string t = time ? time : "";
    if (t.size() < 6 || (t.size() > 6 && t[6] != '.'))
        return t;
    return t.substr(0, 2) + ':' + t.substr(2, 2) + ':' + t.substr(4, 2);
}

std::string timeString(const std::string& t, bool inverted)
{
    const size_t point = t.find('.');
    const bool hasFraction = point != std::string::npos;
    if (hasFraction && t.size() < 8)
        return {};
    if (!hasFraction && t.size() < 6)
        return t;

    std::string digits = '1' + t;
    std::string fraction;
    if (hasFraction) {
        digits[point + 1] = '1';
        const int value = number(digits.substr(point + 1));
        fraction = inverted ? padded(6, 1999999LL - value) : withoutFirst(value);
    }
    const int time = number(digits.substr(0, 7));
    if (inverted)
        return padded(8, 1240000LL - time) + '.' + fraction;
    return std::to_string(time) + withoutFirst(time) + '.' + fraction;
}

std::pair<long, long> splitDateTime(long seconds)
{
    const std::time_t time = seconds;
    std::tm local{};
    tzset();  // as localtime() does, and localtime_r() need not
    if (!localtime_r(&time, &local))
        return {0, 0};
    return {local.tm_year * 10000L + local.tm_mon * 100L + local.tm_mday + 19000100L,
            local.tm_hour * 10000L + local.tm_min * 100L + local.tm_sec};
}

std::pair<std::string, std::string> splitAndReformatDateTime(const std::string& s, char separator)
{
    const size_t end = s.find(separator);
    if (end == std::string::npos)
        return {};
    return {dateReformat(std::stol(s.substr(0, end))), timeReformat(s.c_str() + end + 1)};
}

}  // namespace Tmg
