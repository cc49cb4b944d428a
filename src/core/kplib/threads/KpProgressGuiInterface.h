#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

#include <functional>
#include <string>

/// A display of progress, implemented by a user interface. KpProgressInterface::setProgressGui()
/// attaches it to one progress at a time. Values run from 0 to the maximum, which changes with the
/// nesting of the work.
class KPLIB_API KpProgressGuiInterface {
public:
    KpProgressGuiInterface() = default;
    KpProgressGuiInterface(const KpProgressGuiInterface&) = delete;
    KpProgressGuiInterface& operator=(const KpProgressGuiInterface&) = delete;
    /// Detaches itself.
    virtual ~KpProgressGuiInterface();

    /// Sets the text. `text` is destroyed when the work is cancelled: copy it first if it is
    /// needed.
    virtual void setText(const std::string& text) = 0;
    /// Sets the maximum of setValue().
    virtual void setMaximum(int maximum) = 0;
    /// Sets the position, from 0 to the maximum.
    virtual void setValue(int value) = 0;
    /// Called when the work has ended, with its outcome.
    virtual void setCompleted(const KpResult& result) = 0;
    /// Sets the title of the display; does nothing here.
    virtual void setWindowTitle(const std::string& title);
    /// Shows the display; does nothing here.
    virtual void show();

private:
    friend class KpProgressInterface;

    KpProgressInterface* progress_ = nullptr;

protected:
    /// Cancels the work. Empty while detached. Call it on the thread of the work when the user
    /// cancels.
    std::function<void()> cancelCallback;  // for derived classes to call, and so without _
};
