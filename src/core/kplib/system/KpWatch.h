#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

#include <cstdint>

/// A stop watch on the system's monotonic counter, which adds up the time of several runs. One
/// thread at a time.
///
/// A watch that was only continued by cont(), before the first start() of any watch in the
/// process, reports 0.
class KPLIB_API KpWatch {
public:
    /// Starts the watch if `startNow`, otherwise it is stopped at 0.
    explicit KpWatch(bool startNow);
    /// The same with a label for dump(), copied; null for none.
    KpWatch(const char* name, bool startNow);
    template <typename T>
    explicit KpWatch(T* name) = delete;  // a name alone would be taken for the flag
    KpWatch(const KpWatch&) = delete;
    KpWatch& operator=(const KpWatch&) = delete;
    ~KpWatch();

    /// Restarts from 0.
    void start();
    /// Stops and sets the time to 0.
    void reset();
    /// Continues from the time added up so far.
    void cont();

    /// Stops and returns the time, in seconds or rounded to milliseconds (for up to 49 days).
    /// Stopping a stopped watch adds the time since its last start once more.
    float stop();
    /// @{
    /// As stop(), in other units.
    double stop2();
    unsigned int stopMSec();
    /// @}

    /// The time so far, without stopping.
    float getTime() const;
    /// @{
    /// As getTime(), in other units.
    double getTime2() const;
    unsigned int getTimeMSec() const;
    /// @}

    /// Whether time is being added.
    bool isRunning() const { return running_; }

    /// Writes one line to the log with the name, `index` if not 0, the time so far, and the time
    /// since the last dump(). Does nothing without a name. The name is used as a printf() format:
    /// double each percent sign in it.
    void dump(int index);

private:
    std::uint64_t ticks() const;
    std::uint64_t stopTicks();

    bool running_ = false;
    KpString* name_ = nullptr;
    float lastDump_ = -1;  // seconds; negative before the first
    std::uint64_t accumulated_ = 0;
    std::uint64_t startTicks_ = 0;
};

/// Runs a watch for the length of a scope. A watch that is running already stays running.
class KPLIB_API KpScopedWatch {
public:
    /// Continues `watch`, from 0 with `reset`.
    KpScopedWatch(KpWatch& watch, bool reset);
    KpScopedWatch(const KpScopedWatch&) = delete;
    KpScopedWatch& operator=(const KpScopedWatch&) = delete;
    ~KpScopedWatch();

private:
    KpWatch& watch_;
    bool wasRunning_;
};
