#include "Volumes.h"

#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

#include <algorithm>

// What reads a buffer once, or changes it in place or by filling: against a sum of its bytes, a copy of as many bytes,
// and the system's fill.

using namespace kplib::bench;
using namespace kplib::detail;

namespace {

constexpr long bufferSize = 256L << 20;

void readOnly(benchmark::State& state)
{
    const Memory memory = touched(bufferSize);
    auto* words = reinterpret_cast<const std::uint64_t*>(memory.get());
    for (auto _ : state) {
        std::uint64_t sums[8] = {};
        for (long i = 0; i < bufferSize / 8; i += 8)
            for (int k = 0; k < 8; ++k)
                sums[k] ^= words[i + k];
        benchmark::DoNotOptimize(sums);
    }
    report(state, bufferSize, bufferSize);
}

void fillBytes(benchmark::State& state)
{
    const Memory memory = touched(bufferSize);
    for (auto _ : state) {
        std::memset(memory.get(), 7, bufferSize);
        benchmark::ClobberMemory();
    }
    report(state, bufferSize, bufferSize);
}

template <typename T>
void addScans(const std::string& type)
{
    constexpr long n = bufferSize / static_cast<long>(sizeof(T));
    const auto elements = [](const Memory& memory) { return reinterpret_cast<T*>(memory.get()); };
    add("getRange/" + type, [=](benchmark::State& state) {
        const Memory memory = noise<T>(n);
        float min = 0, max = 0;
        for (auto _ : state)
            KpRawData::getRange(elements(memory), n, min, max);
        const auto [low, high] = std::minmax_element(elements(memory), elements(memory) + n);
        if (min != static_cast<float>(*low) || max != static_cast<float>(*high))
            state.SkipWithError("wrong range");
        report(state, n, bufferSize, "xor of all words", 1.2);
    });
    add("isConstant/" + type, [=](benchmark::State& state) {
        const Memory memory = touched(bufferSize);
        bool isConstant = true;
        for (auto _ : state)
            isConstant = isConstant && KpRawData::isConstant(elements(memory), n);
        if (!isConstant)
            state.SkipWithError("found a difference");
        report(state, n, bufferSize, "xor of all words", 1.2);
    });
    add("memset/" + type, [=](benchmark::State& state) {
        const Memory memory = touched(bufferSize);
        for (auto _ : state) {
            KpRawData::memset(elements(memory), 100, n);
            benchmark::ClobberMemory();
        }
        if (std::count(elements(memory), elements(memory) + n, T(100)) != n)
            state.SkipWithError("wrong values");
        report(state, n, bufferSize, "std::memset", 1.2);
    });
    for (const auto& path : rangePaths()) {
        if (path.usable)
            add("getRange/" + type + "/64Ki/" + path.name, [=](benchmark::State& state) {
                const Memory memory = noise<T>(fewVoxels);
                T low = elements(memory)[0], high = low;
                for (auto _ : state)
                    path.run(KpTypedPointer(elements(memory)).type)(memory.get(), fewVoxels, &low, &high);
                report(state, fewVoxels, fewVoxels * sizeof(T), "getRange/" + type + "/64Ki/plain");
            });
    }
}

void addSwap(int width)
{
    const std::string copy = copyBaseline(2 * bufferSize), name = "swapBytes/" + std::to_string(width);
    add(name, [=](benchmark::State& state) {
        const Memory memory = touched(bufferSize);
        const auto swap = width == 2   ? KpRawData::swapBytesWord2
                          : width == 4 ? KpRawData::swapBytesWord4
                                       : KpRawData::swapBytesWord8;
        memory.get()[0] = 2;
        swap(memory.get(), bufferSize / width);
        if (memory.get()[width - 1] != 2)
            state.SkipWithError("wrong bytes");
        for (auto _ : state) {
            swap(memory.get(), static_cast<unsigned long>(bufferSize / width));
            benchmark::ClobberMemory();
        }
        report(state, bufferSize / width, 2.0 * bufferSize, copy, 1.2);
    });
    for (const auto& path : swapPaths()) {
        if (path.usable)
            add(name + "/64Ki/" + path.name, [=](benchmark::State& state) {
                const Memory memory = touched(fewVoxels * width);
                for (auto _ : state) {
                    path.run(width)(memory.get(), fewVoxels);
                    benchmark::ClobberMemory();
                }
                report(state, fewVoxels, 2.0 * fewVoxels * width, name + "/64Ki/plain");
            });
    }
}

[[maybe_unused]] const bool isRegistered = [] {
    add("xor of all words", readOnly);
    add("std::memset", fillBytes);
    addScans<std::uint8_t>("byte");
    addScans<std::int16_t>("short");
    addScans<float>("float");
    addScans<double>("double");
    for (int width : {2, 4, 8})
        addSwap(width);
    return true;
}();

}  // namespace
