#include <kplib/log/detail/LogClock.h>

#include <cstdio>
#include <cstdlib>
#include <ctime>

namespace kplib::detail {

std::string_view LogClock::dateAndTime(kplib::platform::WallTime time)
{
    const char* const set = std::getenv("TZ");
    const char* const zone = set ? set : ":/etc/localtime";  // what the C library reads when none is set
    if (zone_ != zone || time.seconds != second_) {
        zone_ = zone;
        split(time.seconds);
    }
    char* const end = text_ + length_;
    end[0] = '.';
    end[1] = static_cast<char>('0' + time.milliseconds / 100);
    end[2] = static_cast<char>('0' + time.milliseconds / 10 % 10);
    end[3] = static_cast<char>('0' + time.milliseconds % 10);
    return {text_, static_cast<size_t>(length_) + 4};
}

void LogClock::split(std::int64_t seconds)
{
    tzset();
    const time_t moment = seconds;
    tm local{};
    localtime_r(&moment, &local);
    length_ = std::snprintf(text_, sizeof text_ - 4, "%04d-%02d-%02d %02d:%02d:%02d", local.tm_year + 1900,
                            local.tm_mon + 1, local.tm_mday, local.tm_hour, local.tm_min, local.tm_sec);
    second_ = seconds;
}

std::string_view LogClock::elapsed(kplib::platform::WallTime start, kplib::platform::WallTime now)
{
    const bool borrows = now.milliseconds < start.milliseconds;
    const int milliseconds = now.milliseconds - start.milliseconds + (borrows ? 1000 : 0);
    const long t = now.seconds - start.seconds - (borrows ? 1 : 0);
    const int length = std::snprintf(elapsed_, sizeof elapsed_, "%02d:%02d:%02d.%03d", static_cast<int>(t / 3600 % 24),
                                     static_cast<int>(t / 60 % 60), static_cast<int>(t % 60), milliseconds);
    return {elapsed_, static_cast<size_t>(length)};
}

}  // namespace kplib::detail
