#include <kplib/threads/KpProgressInterface.h>

#include <kplib/log/KpLogFile.h>
#include <kplib/threads/KpProgressGuiInterface.h>

#include <algorithm>
#include <climits>
#include <functional>
#include <utility>

namespace {

// Drops the offset of a scope that closes, as the last step, even if the calls before it throw.
struct OffsetDropper {
    std::vector<long>& offsets;
    ~OffsetDropper() { offsets.pop_back(); }
};

// Places on the scale of all scopes are longs within 2^62, to which any int can be added, and what user interfaces see
// of them is cut to an int. So a scope whose own scale is beyond an int leaves the places of those around it right.

long product(long place, int maximum)
{
    constexpr long limit = 1L << 62;
    long result = 0;
    if (__builtin_mul_overflow(place, maximum, &result))
        result = place < 0 ? -limit : limit;
    return std::clamp(result, -limit, limit);
}

int toInt(long place)
{
    return static_cast<int>(std::clamp<long>(place, INT_MIN, INT_MAX));
}

}  // namespace

void KpProgressInterface::setProgressGui(KpProgressGuiInterface* gui)
{
    if (gui_) {
        gui_->cancelCallback = nullptr;
        gui_->progress_ = nullptr;
    }
    gui_ = gui;
    if (gui_) {
        gui_->cancelCallback = [this] { cancel(); };
        gui_->progress_ = this;
    }
}

void KpProgressInterface::startWorking(int maximum, std::string text)
{
    if (canceled_ || maximum < 1)
        return;
    if (text.empty() && !steps_.empty())
        text = steps_.back().text;
    Step step{text, maximum};
    steps_.reserve(steps_.size() + 1);  // all allocations first, so that a failure changes nothing
    offsets_.reserve(offsets_.size() + 1);
    if (steps_.empty()) {
        working_ = true;
        beforeStartWorking();
    }
    steps_.push_back(std::move(step));
    value_ = product(value_, maximum);
    offsets_.push_back(value_);
    setMaximumGlobal(globalMaximum());
    setProgressText(text.c_str());  // not that of the scope: a user interface may have canceled by now
    setProgressValue(0);
}

void KpProgressInterface::stopWorking()
{
    if (steps_.empty()) {
        if (std::exchange(working_, false))
            afterStopWorking();
        return;
    }
    const OffsetDropper dropper{offsets_};
    const int maximum = steps_.back().maximum;
    steps_.pop_back();
    if (steps_.empty()) {
        working_ = false;
        value_ = maximum;
        afterStopWorking();
        return;
    }
    value_ = offsets_.back() / maximum + 1;
    setProgressText(steps_.back().text.c_str());
    setMaximumGlobal(globalMaximum());
    setProgressValueGlobal(toInt(value_));
}

void KpProgressInterface::setProgressValue(int value)
{
    if (canceled_ || steps_.empty())
        return;
    value_ = std::min(value, steps_.back().maximum) + offsets_.back();
    setProgressValueGlobal(toInt(value_));
}

void KpProgressInterface::cancel()
{
    if (!cancelable_)
        return;
    canceled_ = true;
    terminate();
}

bool KpProgressInterface::isCanceled() const
{
    return canceled_;
}

void KpProgressInterface::setFailed(const KpResult& failure, const char* message)
{
    if (!message)
        message = "";
    getTheLogInstance().errorf("Operation failed: '%s'", message);
    result_ = KpResult(failure.code(), message, "");
    terminate();
}

KpProgressInterface::~KpProgressInterface()
{
    KpProgressInterface::setProgressGui(nullptr);
}

void KpProgressInterface::beforeStartWorking() {}

void KpProgressInterface::afterStopWorking()
{
    if (canceled_ && result_.isOk())
        result_ = KpResult(KpResult::Interrupted, "", "");
    setCompleted(result_);
    cancelable_ = true;
}

void KpProgressInterface::setProgressValueGlobal(int value)
{
    if (gui_ && !canceled_)
        gui_->setValue(value);
}

int KpProgressInterface::currentProgressValue() const
{
    return toInt(value_);
}

void KpProgressInterface::setMaximumGlobal(int maximum)
{
    if (gui_)
        gui_->setMaximum(maximum);
}

void KpProgressInterface::setProgressText(const char* text)
{
    if (!text)
        text = "";
    if (steps_.empty()) {
        if (gui_)
            gui_->setText(text);
        return;
    }
    std::string& current = steps_.back().text;
    current = text;
    if (gui_)
        gui_->setText(current);  // and no copy, as closing a scope must not need memory
}

const char* KpProgressInterface::progressText() const
{
    return steps_.empty() ? "" : steps_.back().text.c_str();
}

void KpProgressInterface::setCompleted(const KpResult& result)
{
    if (gui_)
        gui_->setCompleted(result);
}

void KpProgressInterface::nextStep()
{
    if (!canceled_ && !offsets_.empty())
        setProgressValue(toInt(value_ + 1 - offsets_.back()));
}

void KpProgressInterface::terminate()
{
    while (!steps_.empty())
        stopWorking();
}

int KpProgressInterface::globalMaximum() const
{
    long scale = 1;
    for (const Step& step : steps_)
        scale = product(scale, step.maximum);
    return toInt(scale);
}
