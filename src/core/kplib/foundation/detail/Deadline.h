#pragma once

#include <ctime>
#include <sys/time.h>

namespace kplib::detail {

// The wall-clock time that is `milliseconds` after `now`, whose part below a millisecond is dropped.
inline timespec deadlineAfter(timeval now, unsigned long milliseconds)
{
    const unsigned long ms = static_cast<unsigned long>(now.tv_usec) * 1000 / 1000000 + milliseconds % 1000;
    timespec deadline{};
    deadline.tv_sec = static_cast<time_t>(milliseconds / 1000 + ms / 1000) + now.tv_sec;
    deadline.tv_nsec = static_cast<long>(ms % 1000 * 1000000);
    return deadline;
}

}  // namespace kplib::detail
