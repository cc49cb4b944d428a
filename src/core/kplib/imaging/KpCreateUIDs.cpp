#include <kplib/imaging/KpCreateUIDs.h>

#include <kplib/imaging/detail/UIDClock.h>

#include <algorithm>
#include <atomic>
#include <cstdint>
#include <ctime>

#include <unistd.h>

namespace {

std::atomic<long long> sCounter = 0;  // the last one given

constexpr long long sMacAddress = 84320313;  // in place of a node: all hosts share it

std::tm localTime(std::time_t time)
{
    std::tm local{};
    tzset();
    localtime_r(&time, &local);
    return local;
}

// Date and time as one number, five digits above the second. The part down to the hour has 32 bits.
long long timeStamp(std::time_t time)
{
    const std::tm local = localTime(time);
    const auto year = static_cast<std::uint32_t>(std::max(local.tm_year + 1900, 2000));
    const auto month = static_cast<std::uint32_t>(local.tm_mon + 1);
    const auto day = static_cast<std::uint32_t>(local.tm_mday);
    const auto date = static_cast<std::int32_t>(((year * 100 + month) * 100 + day) * 100 +
                                                static_cast<std::uint32_t>(local.tm_hour) - 2000000000U);
    return ((date * 100LL + local.tm_min) * 100 + local.tm_sec) * 100000;
}

// The stamp of this second. The C library takes a lock that all threads share, so each thread
// calls it once a second.
long long currentTimeStamp()
{
    thread_local std::time_t second = -1;
    thread_local long long stamp = 0;
    const std::time_t now = kplib::detail::uidClock();
    if (now != second) {
        stamp = timeStamp(now);
        second = now;
    }
    return stamp;
}

long long nextCounter()
{
    const long long stamp = currentTimeStamp();
    long long last = sCounter.load(std::memory_order_relaxed);
    long long next = stamp + (last + 1) % 1000;
    do {
        if (last >= next)
            next = last + 1;
    } while (!sCounter.compare_exchange_weak(last, next, std::memory_order_relaxed));
    return next;
}

}  // namespace

namespace kplib::detail {

std::time_t (*uidClock)() = [] { return std::time(nullptr); };

int uidProcessPart(int processId)
{
    const int part = processId % 100000;
    return part < 10000 ? part + 90000 : part;
}

}  // namespace kplib::detail

KpCreateUIDs::KpCreateUIDs()
{
    reset();
}

void KpCreateUIDs::reset()
{
    version_ = "7";
    rootUID_ = "1.2.276.0.77";
}

bool KpCreateUIDs::setText(KpString& field, const char* text, const char* error)
{
    if (!text || !*text) {
        setLastError(error);
        return false;
    }
    field = text;
    return true;
}

bool KpCreateUIDs::setRootUID(const char* root)
{
    return setText(rootUID_, root, "[setRootUID] Got empty root UID.");
}

bool KpCreateUIDs::setVersion(const char* version)
{
    return setText(version_, version, "[setVersion] Got empty version string.");
}

bool KpCreateUIDs::createUID(UIDtype type, KpString& uid)
{
    if (type < UIDtype0 || type > UIDtype4) {
        uid = "";
        setLastError("[createUID] Invalid type specified.");
        return false;
    }
    uid.printf("%s.%s.%d.%lld.%lld.%d", rootUID_.c_str(), version_.c_str(), type + 2, sMacAddress, nextCounter(),
               kplib::detail::uidProcessPart(getpid()));
    return true;
}

void KpCreateUIDs::getDateTime(int& year, int& month, int& day, int& hour, int& minute, int& second)
{
    const std::tm local = localTime(kplib::detail::uidClock());
    year = local.tm_year + 1900;
    month = local.tm_mon + 1;
    day = local.tm_mday;
    hour = local.tm_hour;
    minute = local.tm_min;
    second = local.tm_sec;
}
