#include <kplib/system/KpWatch.h>

#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/platform/Platform.h>

#include <atomic>
#include <cmath>

namespace {

// Seconds per tick, always set to the same value. Intentional: 0 until a watch is first started.
std::atomic<double> cFactor = 0;

double seconds(std::uint64_t ticks)
{
    return static_cast<double>(ticks) * cFactor.load(std::memory_order_relaxed);
}

unsigned int milliseconds(std::uint64_t ticks)
{
    const double value = std::rint(static_cast<double>(ticks) * 1000.0 * cFactor.load(std::memory_order_relaxed));
    return static_cast<unsigned int>(static_cast<std::uint64_t>(value));  // a larger value wraps
}

// Rounds towards zero. A larger value wraps, as a watch that was never started counts from the
// start of the system.
int truncated(double value)
{
    return static_cast<int>(static_cast<std::int64_t>(value));
}

}  // namespace

KpWatch::KpWatch(bool startNow) : KpWatch(nullptr, startNow) {}

KpWatch::KpWatch(const char* name, bool startNow) : name_(name ? new KpString(name) : nullptr)
{
    if (startNow)
        start();
}

KpWatch::~KpWatch()
{
    delete name_;
}

void KpWatch::start()
{
    if (cFactor.load(std::memory_order_relaxed) == 0) {
        const kplib::platform::TickRatio ratio = kplib::platform::tickRatio();
        cFactor.store(static_cast<double>(ratio.numerator) / ratio.denominator * 1e-9, std::memory_order_relaxed);
    }
    lastDump_ = -1;
    accumulated_ = 0;
    cont();
}

void KpWatch::reset()
{
    running_ = false;
    accumulated_ = 0;
}

void KpWatch::cont()
{
    running_ = true;
    startTicks_ = kplib::platform::ticks();
}

std::uint64_t KpWatch::ticks() const
{
    return accumulated_ + (running_ ? kplib::platform::ticks() - startTicks_ : 0);
}

std::uint64_t KpWatch::stopTicks()
{
    running_ = false;
    accumulated_ += kplib::platform::ticks() - startTicks_;
    return accumulated_;
}

float KpWatch::stop()
{
    return static_cast<float>(stop2());
}

double KpWatch::stop2()
{
    return seconds(stopTicks());
}

unsigned int KpWatch::stopMSec()
{
    return milliseconds(stopTicks());
}

float KpWatch::getTime() const
{
    return static_cast<float>(getTime2());
}

double KpWatch::getTime2() const
{
    return seconds(ticks());
}

unsigned int KpWatch::getTimeMSec() const
{
    return milliseconds(ticks());
}

void KpWatch::dump(int index)
{
    if (!name_ || name_->isEmpty())
        return;
    const double t = getTime2();
    const int ms = truncated(1000.0 * t);
    KpString line = index != 0 ? KpString(0, " --- %s [%02d]: %d msec", name_->c_str(), index, ms)
                               : KpString(0, " --- %s: %d msec", name_->c_str(), ms);
    if (lastDump_ >= 0)
        line += KpString(0, "  (+ %d ms)", truncated((t - static_cast<double>(lastDump_)) * 1000));
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-security"
    getTheLogInstance().printf(line);  // intentional: the name is a format
#pragma GCC diagnostic pop
    lastDump_ = static_cast<float>(t);
}

KpScopedWatch::KpScopedWatch(KpWatch& watch, bool reset) : watch_(watch)
{
    if (reset)
        watch_.reset();
    wasRunning_ = watch_.isRunning();
    if (!wasRunning_)
        watch_.cont();
}

KpScopedWatch::~KpScopedWatch()
{
    if (!wasRunning_)
        watch_.stop();
}
