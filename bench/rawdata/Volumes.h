#pragma once

#include <support/Bench.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <random>
#include <string>

namespace kplib::bench {

constexpr long manyVoxels = 64L << 20;  // out of cache
constexpr long fewVoxels = 64L << 10;   // in the second cache

struct Free {
    void operator()(void* p) const { std::free(p); }
};
using Memory = std::unique_ptr<char, Free>;

/// Memory that was touched before.
inline Memory touched(long bytes)
{
    Memory memory(static_cast<char*>(std::aligned_alloc(4096, static_cast<size_t>((bytes + 4095) / 4096 * 4096))));
    std::memset(memory.get(), 1, static_cast<size_t>(bytes));
    return memory;
}

/// Grey values of a CT's kind: most are within the range of a byte, some below and above.
template <typename T>
Memory noise(long n)
{
    Memory memory = touched(n * static_cast<long>(sizeof(T)));
    auto* values = reinterpret_cast<T*>(memory.get());
    std::minstd_rand random(1);
    for (long i = 0; i < n; ++i)
        values[i] = static_cast<T>(static_cast<int>(random() % 360) - 50);
    return memory;
}

/// The name of a baseline: a block copy that reads and writes `bytes` in all.
inline std::string copyOf(long bytes)
{
    return "std::memcpy/" + std::to_string(bytes);
}

/// How many blocks of that size to take in turn, so that none is in a cache when it is read again.
inline long turns(long bytes)
{
    return std::max(1L, (256L << 20) / bytes);
}

inline void copyBytes(benchmark::State& state, long bytes)
{
    const long size = bytes / 2, count = turns(size);
    const Memory from = touched(size * count), to = touched(size * count);
    long turn = 0;
    for (auto _ : state) {
        std::memcpy(to.get() + turn * size, from.get() + turn * size, static_cast<size_t>(size));
        benchmark::ClobberMemory();
        turn = (turn + 1) % count;
    }
    report(state, static_cast<double>(bytes / 2), static_cast<double>(bytes));
}

/// Registers that baseline, once a run.
std::string copyBaseline(long bytes);

template <typename Function, typename... Args>
benchmark::internal::Benchmark* add(const std::string& name, Function function, Args... args)
{
    return benchmark::RegisterBenchmark(name.c_str(), function, args...)->Unit(benchmark::kMillisecond);
}

}  // namespace kplib::bench
