#include <support/Bench.h>

#include <kplib/threads/KpWorkerThread.h>

#include <sched.h>

#include <condition_variable>
#include <mutex>
#include <thread>

// A pass to a waiting worker and back. The baseline is what any such hand-over needs: a flag, a mutex, and a condition
// for each side. Caller and worker share one processor, have one each, or go where the scheduler puts them.

namespace {

struct Placement {
    const char* name;
    int caller, worker;  // a processor, -1 for any
};
const Placement placements[] = {{"one", 0, 0}, {"two", 0, 1}, {"free", -1, -1}};

cpu_set_t bindTo(int processor)
{
    cpu_set_t before, set;
    sched_getaffinity(0, sizeof before, &before);
    CPU_ZERO(&set);
    if (processor >= 0) {
        CPU_SET(processor, &set);
        sched_setaffinity(0, sizeof set, &set);
    }
    return before;
}

// Binds the caller for the length of a benchmark.
class Bound {
public:
    explicit Bound(int processor) : before_(bindTo(processor)) {}
    Bound(const Bound&) = delete;
    Bound& operator=(const Bound&) = delete;
    ~Bound() { sched_setaffinity(0, sizeof before_, &before_); }

private:
    cpu_set_t before_;
};

void pingPong(benchmark::State& state, Placement at)
{
    std::mutex mutex;
    std::condition_variable callerCondition, workerCondition;
    enum { Answered, Asked, Ended } turn = Answered;
    long passes = 0;
    const auto hand = [&](auto to, std::condition_variable& condition) {
        {
            const std::lock_guard lock(mutex);
            turn = to;
        }
        condition.notify_one();
    };
    const auto await = [&](std::condition_variable& condition, auto isOurs) {
        std::unique_lock lock(mutex);
        condition.wait(lock, isOurs);
    };
    std::jthread worker([&] {
        const Bound bound(at.worker);
        for (;;) {
            await(workerCondition, [&] { return turn != Answered; });
            if (turn == Ended)
                return;
            ++passes;
            hand(Answered, callerCondition);
        }
    });
    const Bound bound(at.caller);
    for (auto _ : state) {
        hand(Asked, workerCondition);
        await(callerCondition, [&] { return turn == Answered; });
    }
    hand(Ended, workerCondition);
    worker.join();
    if (passes != state.iterations())
        state.SkipWithError("wrong number of passes");
    kplib::bench::report(state, 1, 0);
}

class Counter final : public KpWorkerThread {
public:
    explicit Counter(int processor) : KpWorkerThread("bench"), processor_(processor) {}
    ~Counter() override { terminate(); }
    void computeCtor() override { bindTo(processor_); }
    void compute() override { ++passes; }

    long passes = 0;

private:
    int processor_;
};

void workerPass(benchmark::State& state, Placement at)
{
    Counter worker(at.worker);
    worker.start(true);
    const Bound bound(at.caller);
    for (auto _ : state) {
        worker.start(true);
        worker.wait();
    }
    if (worker.passes != state.iterations() + 1)
        state.SkipWithError("wrong number of passes");
    // The scheduler may put one of the two on one processor and the other on two: no limit for that.
    kplib::bench::report(state, 1, 0, std::string("pingPong/") + at.name, at.caller < 0 ? 0 : 1.2);
}

[[maybe_unused]] const bool registered = [] {
    for (const Placement& at : placements) {
        benchmark::RegisterBenchmark((std::string("pingPong/") + at.name).c_str(), pingPong, at)->UseRealTime();
        benchmark::RegisterBenchmark((std::string("KpWorkerThread/pass/") + at.name).c_str(), workerPass, at)
            ->UseRealTime();
    }
    return true;
}();

}  // namespace
