#pragma once

#include <kplib/platform/Platform.h>

#include <cstdint>
#include <string>
#include <string_view>

namespace kplib::detail {

// Times as text, each valid until the next is asked for. Local time above the millisecond is kept for as long as the
// second and the time zone in the environment stay the same. One thread at a time.
class LogClock {
public:
    // Local date and time, "2017-03-01 14:03:59.120".
    std::string_view dateAndTime(kplib::platform::WallTime time);

    // The time from `start` to `now`, "00:00:01.050"; the hours wrap at 24.
    std::string_view elapsed(kplib::platform::WallTime start, kplib::platform::WallTime now);

private:
    void split(std::int64_t seconds);

    std::int64_t second_ = 0;
    std::string zone_;  // empty before the first call
    char text_[48] = {};
    int length_ = 0;  // of the text without milliseconds
    char elapsed_[48] = {};
};

}  // namespace kplib::detail
