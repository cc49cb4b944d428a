#include "Soak.h"

#include <kplib/threads/KpProgressInterface.h>
#include <kplib/threads/KpWorkerThread.h>
#include <kplib/threads/ProgressScope.h>

namespace kplib::probe {

namespace {

/// Counts its passes and the steps of the last one.
class Counter : public KpWorkerThread {
public:
    Counter() : KpWorkerThread("soak") {}
    ~Counter() override { terminate(); }

    void compute() override
    {
        KpProgressInterface progress;
        const ProgressScope scope(&progress);
        progress.startWorking(steps, "soak");
        for (done = 0; done < steps && !canceled(); ++done) {
            suspended();
            progress.nextStep();
        }
        ++passes;
    }

    static constexpr int steps = 2000;
    int done = 0;
    std::uint64_t passes = 0;
};

}  // namespace

void runWorker(int number, Tally& tally)
{
    while (!tally.isOver) {
        Counter counter;  // a thread of its own each time
        for (std::uint64_t pass = 1; pass <= 200; ++pass) {
            counter.start(false);
            if (pass % 3 == 0 && counter.suspend())
                counter.resume();
            const bool isCanceled = pass % 7 == static_cast<unsigned>(number % 7) && counter.cancel();
            counter.wait();
            if (counter.passes != pass || (!isCanceled && counter.done != Counter::steps))
                tally.fault("worker " + std::to_string(number) + " has not done pass " + std::to_string(pass));
            ++tally.passes;
        }
    }
}

}  // namespace kplib::probe
