#pragma once

namespace kplib::test {

/// While one lives, threads of the process linger now and then before they take a mutex, wait or signal. One at a time.
class RandomSchedule {
public:
    explicit RandomSchedule(unsigned seed);
    RandomSchedule(const RandomSchedule&) = delete;
    RandomSchedule& operator=(const RandomSchedule&) = delete;
    ~RandomSchedule();
};

/// While one lives, the platform has no thread to give.
class NoNewThreads {
public:
    NoNewThreads();
    NoNewThreads(const NoNewThreads&) = delete;
    NoNewThreads& operator=(const NoNewThreads&) = delete;
    ~NoNewThreads();
};

}  // namespace kplib::test
