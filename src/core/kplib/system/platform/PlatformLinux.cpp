#include <kplib/system/platform/Platform.h>

#include <ctime>

namespace kplib::platform {

std::uint64_t ticks()
{
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);  // cannot fail for this clock, nor for the other below
    return static_cast<std::uint64_t>(now.tv_sec) * 1'000'000'000u + static_cast<std::uint64_t>(now.tv_nsec);
}

TickRatio tickRatio()
{
    return {1, 1};
}

WallTime wallTime()
{
    timespec now{};
    clock_gettime(CLOCK_REALTIME, &now);
    return {now.tv_sec, static_cast<int>(now.tv_nsec / 1'000'000)};
}

const char* name()
{
    return "Linux";
}

}  // namespace kplib::platform
