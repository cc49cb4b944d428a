#pragma once

#include <kplib/foundation/KpString.h>
#include <kplib/threads/KpProgressGuiInterface.h>

#include <string>

/// Shows progress on standard error: a bar on a terminal, a line a stage elsewhere. A signal cancels the job at its
/// next step.
class TerminalProgress : public KpProgressGuiInterface {
public:
    TerminalProgress();
    ~TerminalProgress() override;

    void setText(const std::string& text) override;
    void setMaximum(int maximum) override;
    void setValue(int value) override;
    void setCompleted(const KpResult& result) override;

private:
    void draw();

    bool isTerminal_;
    int maximum_ = 1, value_ = 0, drawn_ = -1;
    std::string text_;
};
