#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>
#include <kplib/log/KpResult.h>

#include <atomic>
#include <cstddef>
#include <string>
#include <vector>

/// Progress and cancellation of a long computation, which receives a pointer to such an object, or
/// null.
///
/// Work nests: each startWorking() opens a scope with a number of steps. A nested scope counts as
/// one step of the scope around it. The user interface shows one scale, whose maximum is the
/// product of the maxima of all open scopes. Use ProgressScope so that scopes are closed however
/// the computation returns.
///
/// Cancelling closes all scopes; the computation polls isCanceled(). A cancelled object stays
/// cancelled and ignores further work: use a new object for new work. Values and maxima are at
/// most INT_MAX.
///
/// Threads: any thread may poll isCanceled() and canCancel(). All other functions are for one
/// thread at a time. cancel() also closes the scopes, which are not guarded: call it on the thread
/// of the work, or while the work opens and closes no scope and makes no step.
class KPLIB_API KpProgressInterface {
public:
    KpProgressInterface() = default;
    KpProgressInterface(const KpProgressInterface&) = delete;
    KpProgressInterface& operator=(const KpProgressInterface&) = delete;

    /// Attaches a user interface, which the caller owns, in place of the previous one. Null
    /// attaches none.
    virtual void setProgressGui(KpProgressGuiInterface* gui);

    /// Opens a scope of `maximum` steps. An empty text stands for the text of the scope around it.
    /// Does nothing if cancelled or if `maximum` is below 1.
    virtual void startWorking(int maximum, std::string text);
    /// Closes the innermost scope, which advances the scope around it by one step. Closing the
    /// outermost scope ends the work.
    virtual void stopWorking();
    /// The position in the innermost scope, at most its maximum.
    virtual void setProgressValue(int value);

    /// Ends the work with a failure of the code Interrupted. Does nothing while cancelling is
    /// disabled.
    virtual void cancel();
    /// Whether cancel() ended the work.
    virtual bool isCanceled() const;

    /// Ends the work with a failure of that code and text, which is also logged as an error. Null
    /// is an empty text.
    virtual void setFailed(const KpResult& failure, const char* message);

    /// Detaches the user interface.
    virtual ~KpProgressInterface();

    /// Called before the first scope opens.
    virtual void beforeStartWorking();
    /// Called when the last scope has closed: passes the outcome to the user interface and enables
    /// cancel() again.
    virtual void afterStopWorking();

    /// Passes the value on to the user interface, if there is one.
    virtual void setProgressValueGlobal(int value);
    /// The value on the scale of all open scopes.
    virtual int currentProgressValue() const;
    /// Passes the scale on, as above.
    virtual void setMaximumGlobal(int maximum);
    /// Passes the text on, as above. It also becomes the text of the innermost scope.
    virtual void setProgressText(const char* text);
    /// The text of the innermost scope, or "" if no scope is open. Valid until it changes.
    virtual const char* progressText() const;
    /// Passes the outcome on, as above.
    virtual void setCompleted(const KpResult& result);

    /// Advances the innermost scope by one step.
    void nextStep();
    /// Closes all scopes.
    void terminate();
    /// Makes cancel() do nothing until the work has ended.
    void disableCancel() { cancelable_ = false; }
    /// As setProgressText().
    void setProgressInfo(const char* text) { setProgressText(text); }

    /// The product of the maxima of all open scopes, at most INT_MAX; 1 if no scope is open.
    int globalMaximum() const;
    /// Whether a scope is open.
    bool isWorking() const { return working_; }
    /// Whether cancel() has an effect.
    bool canCancel() const { return cancelable_; }
    /// The outcome so far. A failure is kept during later work.
    const KpResult& result() const { return result_; }

private:
    friend class ProgressScope;

    struct Step {
        std::string text;
        int maximum;
    };

    KpProgressGuiInterface* gui_ = nullptr;
    bool working_ = false;
    std::atomic<bool> cancelable_ = true;
    std::atomic<bool> canceled_ = false;  // what cancel() of another thread writes and the computation polls
    long value_ = 0;
    KpResult result_;
    std::vector<Step> steps_;    // the open scopes, innermost last
    std::vector<long> offsets_;  // the global value at which each of them starts, on its own scale
};
