#include <support/Bench.h>

#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandableThreaded.h>
#include <kplib/foundation/KpHandle.h>

#include <atomic>

// A handle is copied and the copy dropped. The baselines do the least that keeps a count: one up, one down and a test
// of the result.

namespace {

struct Plain : KpHandable {
    static constexpr const char* baseline = "counter/bare";
    static constexpr double limit = 1.3;
};
struct Threaded : KpHandableThreaded {
    static constexpr const char* baseline = "counter/atomic";
    static constexpr double limit = 1.2;
};

[[gnu::noinline]] void never()
{
    benchmark::ClobberMemory();
}

void bareCounter(benchmark::State& state)
{
    int counter = 1;
    int* count = &counter;
    for (auto _ : state) {
        benchmark::DoNotOptimize(count);
        ++*count;
        benchmark::ClobberMemory();
        if (--*count <= 0)
            never();
        benchmark::ClobberMemory();
    }
    kplib::bench::report(state, 1, 0);
}

void atomicCounter(benchmark::State& state)
{
    std::atomic<int> counter = 1;
    std::atomic<int>* count = &counter;
    for (auto _ : state) {
        benchmark::DoNotOptimize(count);
        count->fetch_add(1, std::memory_order_acq_rel);
        benchmark::ClobberMemory();
        if (count->fetch_sub(1, std::memory_order_acq_rel) == 1)
            never();
        benchmark::ClobberMemory();
    }
    kplib::bench::report(state, 1, 0);
}

template <typename T>
void copyAndDrop(benchmark::State& state)
{
    const KpHandle<T> handle(new T);
    const KpHandle<T>* source = &handle;
    for (auto _ : state) {
        benchmark::DoNotOptimize(source);
        const KpHandle<T> copy(*source);
        benchmark::ClobberMemory();
    }
    if (handle->refCount() != 1)
        state.SkipWithError("wrong count");
    kplib::bench::report(state, 1, 0, T::baseline, T::limit);
}

}  // namespace

BENCHMARK(bareCounter)->Name(Plain::baseline);
BENCHMARK(copyAndDrop<Plain>)->Name("KpHandle/KpHandable");
BENCHMARK(atomicCounter)->Name(Threaded::baseline);
BENCHMARK(copyAndDrop<Threaded>)->Name("KpHandle/KpHandableThreaded");
