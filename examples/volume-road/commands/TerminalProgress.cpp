#include "TerminalProgress.h"

#include "Abort.h"

#include <cstdio>
#include <functional>
#include <unistd.h>

TerminalProgress::TerminalProgress() : isTerminal_(isatty(STDERR_FILENO) != 0) {}

TerminalProgress::~TerminalProgress() = default;

void TerminalProgress::setText(const std::string& text)
{
    if (text == text_)
        return;
    text_ = text;
    if (!isTerminal_ && !text_.empty())
        std::fprintf(stderr, "%s ...\n", text_.c_str());
    draw();
}

void TerminalProgress::setMaximum(int maximum)
{
    maximum_ = maximum;
}

void TerminalProgress::setValue(int value)
{
    value_ = value;
    draw();
    if (signalReceived() != 0 && cancelCallback)
        cancelCallback();
}

void TerminalProgress::setCompleted(const KpResult&)
{
    if (isTerminal_)
        std::fputs("\r\033[K", stderr);
}

void TerminalProgress::draw()
{
    constexpr int width = 40;
    const int permille = static_cast<int>(1000.0 * value_ / maximum_);
    if (!isTerminal_ || permille == drawn_)
        return;
    drawn_ = permille;
    const int filled = permille * width / 1000;
    std::fprintf(stderr, "\r[%.*s%*s] %3d%% %s\033[K", filled, "########################################",
                 width - filled, "", permille / 10, text_.c_str());
}
