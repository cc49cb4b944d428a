#include <kplib/threads/KpProgressGuiInterface.h>

#include <kplib/threads/KpProgressInterface.h>

KpProgressGuiInterface::~KpProgressGuiInterface()
{
    if (progress_)
        progress_->setProgressGui(nullptr);
}

void KpProgressGuiInterface::setWindowTitle(const std::string& /*title*/) {}

void KpProgressGuiInterface::show() {}
