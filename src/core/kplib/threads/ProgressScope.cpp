#include <kplib/threads/ProgressScope.h>

#include <kplib/threads/KpProgressInterface.h>

#include <vector>

ProgressScope::ProgressScope(KpProgressInterface* progress) :
    progress_(progress), depth_(progress ? progress->steps_.size() : 0)
{
}

ProgressScope::~ProgressScope()
{
    while (progress_ && progress_->steps_.size() > depth_)
        progress_->stopWorking();
}
