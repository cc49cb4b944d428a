#include <support/Bench.h>

#include <kplib/foundation/KpDArray.h>

#include <vector>

namespace {

constexpr int many = 10'000'000;

void vectorPushBack(benchmark::State& state)
{
    for (auto _ : state) {
        std::vector<int> items;
        for (int i = 0; i < many; ++i)
            items.push_back(i);
        benchmark::DoNotOptimize(items.data());
    }
    kplib::bench::report(state, many, 4.0 * many);
}

void arrayAppend(benchmark::State& state)
{
    for (auto _ : state) {
        KpDArray<int> items;
        for (int i = 0; i < many; ++i)
            items.append(i);
        benchmark::DoNotOptimize(items.data());
    }
    kplib::bench::report(state, many, 4.0 * many, "std::vector/push_back/10M", 1.0);
}

}  // namespace

BENCHMARK(vectorPushBack)->Name("std::vector/push_back/10M")->Unit(benchmark::kMillisecond);
BENCHMARK(arrayAppend)->Name("KpDArray/append/10M")->Unit(benchmark::kMillisecond);
