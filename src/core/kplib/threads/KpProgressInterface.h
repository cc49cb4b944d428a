#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>
#include <kplib/log/KpResult.h>

#include <atomic>
#include <cstddef>
#include <string>
#include <vector>

/// Progress and cancellation of a long computation, which gets a pointer to one of these, or null.
///
/// Work nests: each startWorking() opens a scope of so many steps, and a scope within counts as one step of the scope
/// around it, whatever its own count. What the user interface sees is one scale, the product of all open counts.
/// Open scopes through a ProgressScope, so that they are closed whatever way the computation leaves.
///
/// Cancelling closes all scopes; the computation polls isCanceled(). An object that was canceled stays so and ignores
/// further work: new work takes a new object. On a scale beyond an int, values and maxima are at most INT_MAX.
///
/// Threads: any thread may poll isCanceled() and canCancel(). All else belongs to one thread at a time. cancel() also
/// closes the scopes, which are not guarded: call it on the thread of the work, or while the work opens and closes none
/// and makes no step.
class KPLIB_API KpProgressInterface {
public:
    KpProgressInterface() = default;
    KpProgressInterface(const KpProgressInterface&) = delete;
    KpProgressInterface& operator=(const KpProgressInterface&) = delete;

    /// Attaches the user interface, which stays the caller's, in place of the one before; null for none.
    virtual void setProgressGui(KpProgressGuiInterface* gui);

    /// Opens a scope of `maximum` steps; an empty text takes over that of the scope around it. Nothing happens when
    /// canceled, or when `maximum` is below 1.
    virtual void startWorking(int maximum, std::string text);
    /// Closes the innermost scope, as one step of the scope around it. The outermost ends the work.
    virtual void stopWorking();
    /// The position in the innermost scope, at most its maximum.
    virtual void setProgressValue(int value);

    /// Ends the work with a failure of the code Interrupted, unless it cannot be canceled.
    virtual void cancel();
    /// Whether cancel() ended the work.
    virtual bool isCanceled() const;

    /// Ends the work with a failure of that code and text, which is also an error in the log. Null is an empty text.
    virtual void setFailed(const KpResult& failure, const char* message);

    /// Detaches the user interface.
    virtual ~KpProgressInterface();

    /// Runs before the first scope opens.
    virtual void beforeStartWorking();
    /// Runs when the last scope has closed: passes the outcome to the user interface and enables
    /// cancel() again.
    virtual void afterStopWorking();

    /// These pass on to the user interface, if there is one.
    virtual void setProgressValueGlobal(int value);
    /// The value on the scale of all open scopes.
    virtual int currentProgressValue() const;
    /// Passes the scale on, as above.
    virtual void setMaximumGlobal(int maximum);
    /// Also becomes the text of the innermost scope.
    virtual void setProgressText(const char* text);
    /// The text of the innermost scope, "" without one. Valid until that changes.
    virtual const char* progressText() const;
    /// Passes the outcome on, as above.
    virtual void setCompleted(const KpResult& result);

    /// One step forward in the innermost scope.
    void nextStep();
    /// Closes all scopes.
    void terminate();
    /// Makes cancel() do nothing until the work has ended.
    void disableCancel() { cancelable_ = false; }
    /// As setProgressText().
    void setProgressInfo(const char* text) { setProgressText(text); }

    /// The product of the maxima of all open scopes, at most INT_MAX; 1 without one.
    int globalMaximum() const;
    /// Whether a scope is open.
    bool isWorking() const { return working_; }
    /// Whether cancel() has an effect.
    bool canCancel() const { return cancelable_; }
    /// The outcome so far. A failure stays into later work.
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
