#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

#include <functional>
#include <string>

/// What a user interface implements to show progress; KpProgressInterface::setProgressGui() attaches it, to one at a
/// time. Values run from 0 to the maximum, which changes with the nesting of the work.
class KPLIB_API KpProgressGuiInterface {
public:
    KpProgressGuiInterface() = default;
    KpProgressGuiInterface(const KpProgressGuiInterface&) = delete;
    KpProgressGuiInterface& operator=(const KpProgressGuiInterface&) = delete;
    /// Detaches itself.
    virtual ~KpProgressGuiInterface();

    /// `text` is destroyed when the work is canceled: copy what is needed of it first.
    virtual void setText(const std::string& text) = 0;
    /// The scale of setValue() has changed.
    virtual void setMaximum(int maximum) = 0;
    /// The position on the scale.
    virtual void setValue(int value) = 0;
    /// The work has ended, with this outcome.
    virtual void setCompleted(const KpResult& result) = 0;
    /// Sets the title of the display; does nothing here.
    virtual void setWindowTitle(const std::string& title);
    /// Shows the display; does nothing here.
    virtual void show();

private:
    friend class KpProgressInterface;

    KpProgressInterface* progress_ = nullptr;

protected:
    /// Cancels the work; empty while detached. Call it when the user asks for that, on the thread of the work.
    std::function<void()> cancelCallback;  // for derived classes to call, and so without _
};
