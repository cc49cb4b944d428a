#include "Operation.h"

#include <kplib/threads/KpProgressInterface.h>
#include <kplib/threads/KpThread.h>
#include <kplib/threads/KpWorkerThread.h>
#include <kplib/threads/ProgressScope.h>

namespace kplib::probe {

namespace {

struct Runner : KpThread {
    Runner() : KpThread("a thread with a name that takes memory of its own") {}
    void run() override { value = 7; }
    int value = 0;
};

struct Worker : KpWorkerThread {
    Worker() : KpWorkerThread("a worker with a name that takes memory of its own") {}
    ~Worker() override { terminate(); }
    void compute() override { ++passes; }
    int passes = 0;
};

Outcome thread()
{
    Runner runner;
    runner.start();
    runner.wait();
    return Digest() << runner.value << runner.threadName();
}

Outcome worker()
{
    Worker worker;
    for (int i = 0; i < 3; ++i)
        worker.start(true);
    worker.setName("another name that takes memory of its own");
    return Digest() << worker.passes << worker.name();
}

Outcome progress()
{
    KpProgressInterface progress;
    const ProgressScope outer(&progress);
    progress.startWorking(10, "a text that takes memory of its own");
    progress.nextStep();
    const ProgressScope inner(&progress);
    progress.startWorking(4, "");
    progress.setProgressText("another text that takes memory of its own");
    progress.nextStep();
    return Digest() << progress.globalMaximum() << progress.progressText();
}

Outcome failedProgress()
{
    KpProgressInterface progress;
    progress.startWorking(10, "work");
    progress.cancel();
    return Digest() << progress.isCanceled() << progress.result().codeValue();
}

}  // namespace

Operations threadsOperations()
{
    static constexpr Operation list[] = {
        {"a thread", thread},
        {"a worker", worker},
        {"progress", progress},
        {"progress that is canceled", failedProgress},
    };
    return list;
}

}  // namespace kplib::probe
