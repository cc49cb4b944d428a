#include <kplib/foundation/KpDArray.h>
#include <kplib/net/TmMsg.h>

#include "support/Bench.h"

#include <vector>

// Messages: blocks against a copy of the same bytes, small fields by their number.

namespace {

using kplib::bench::report;

constexpr long count = 4L << 20;
constexpr double bytes = 4.0 * count;
constexpr int fields = 1000;

void copyBlock(benchmark::State& state)
{
    std::vector<float> from(count, 1.0F), to(count, 2.0F);
    for (auto _ : state) {
        std::memcpy(to.data(), from.data(), static_cast<size_t>(bytes));
        benchmark::ClobberMemory();
    }
    report(state, count, bytes);
}

void writeBlock(benchmark::State& state)
{
    KpDArray<float> array;
    array.resize(count);
    std::fill(array.begin(), array.end(), 1.0F);
    TmMsg msg;
    msg << array;
    for (auto _ : state) {
        msg.reset(0);
        msg << array;
        benchmark::ClobberMemory();
    }
    report(state, count, bytes, "copyBlock", 1.05);
}

void readBlock(benchmark::State& state)
{
    KpDArray<float> array;
    array.resize(count);
    std::fill(array.begin(), array.end(), 1.0F);
    TmMsg msg;
    msg << array;
    for (auto _ : state) {
        msg.reset(static_cast<long>(msg.size()));
        msg >> array;
        benchmark::ClobberMemory();
    }
    report(state, count, bytes, "copyBlock", 1.05);
}

void writeFields(benchmark::State& state)
{
    TmMsg msg;
    for (auto _ : state) {
        msg.reset(0);
        for (int i = 0; i < fields / 4; ++i)
            msg << i << 1.0F << static_cast<unsigned char>(i) << 2.0;
        benchmark::ClobberMemory();
    }
    report(state, fields, fields / 4 * 17.0);
}

void readFields(benchmark::State& state)
{
    TmMsg msg;
    for (int i = 0; i < fields / 4; ++i)
        msg << i << 1.0F << static_cast<unsigned char>(i) << 2.0;
    for (auto _ : state) {
        msg.reset(static_cast<long>(msg.size()));
        int number = 0;
        float single = 0;
        unsigned char byte = 0;
        double real = 0;
        for (int i = 0; i < fields / 4; ++i)
            msg >> number >> single >> byte >> real;
        benchmark::DoNotOptimize(number + static_cast<int>(single) + byte + static_cast<int>(real));
    }
    report(state, fields, fields / 4 * 17.0);
}

BENCHMARK(copyBlock);
BENCHMARK(writeBlock);
BENCHMARK(readBlock);
BENCHMARK(writeFields);
BENCHMARK(readFields);

}  // namespace
