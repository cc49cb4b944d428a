#pragma once

#include "../report/Report.h"

#include <kplib/log/KpLogFile.h>
#include <kplib/system/KpWatch.h>
#include <kplib/threads/KpProgressInterface.h>

#include <vector>

/// Runs the stages of a job. Each is one step of the outer progress and one line of the report.
class Road {
public:
    explicit Road(KpProgressInterface& progress) : progress_(progress), watch_(true) {}

    /// Runs a stage that opens a progress of its own; does nothing if one has failed or the job is cancelled.
    template <typename Work>
    void nested(const char* name, Work work)
    {
        if (begins(name)) {
            result_ << work();
            ends(name);
        }
    }

    /// Runs a stage without one.
    template <typename Work>
    void plain(const char* name, Work work)
    {
        if (begins(name)) {
            result_ << work();
            progress_.nextStep();
            ends(name);
        }
    }

    KpResult result() const
    {
        if (progress_.isCanceled())
            return KpResult(KpResult::Interrupted, "cancelled, nothing was written", nullptr);
        return result_;
    }
    const std::vector<Stage>& stages() const { return stages_; }

private:
    bool begins(const char* name)
    {
        if (result_.isBad() || progress_.isCanceled())
            return false;
        progress_.setProgressText(name);
        watch_.start();
        return true;
    }
    void ends(const char* name)
    {
        stages_.push_back({name, watch_.stop2()});
        getTheLogInstance().printf("%s: %.3f s", name, stages_.back().seconds);
    }

    KpProgressInterface& progress_;
    KpWatch watch_;
    KpResult result_;
    std::vector<Stage> stages_;
};
