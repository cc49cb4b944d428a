#include <kplib/volume/KpScanConvert.h>

#include <support/Bench.h>

#include <cmath>
#include <cstring>
#include <vector>

// A folded polygon of 1000 vertices over 2048 x 2048 pixels, against filling as many bytes.

using namespace kplib::bench;

namespace {

constexpr int side = 2048, vertices = 1000;

std::vector<KpVec2f> star()
{
    std::vector<KpVec2f> polygon;
    for (int i = 0; i < vertices; ++i) {
        const float angle = 6.2831855F * static_cast<float>(i) / vertices;
        const float radius = side / 2.0F * (i % 2 ? 0.98F : 0.55F + 0.2F * std::sin(7 * angle));
        polygon.emplace_back(side / 2.0F + radius * std::cos(angle), side / 2.0F + radius * std::sin(angle));
    }
    return polygon;
}

struct Tally {
    long spans = 0, pixels = 0;
};

Tally scanned(const std::vector<KpVec2f>& polygon)
{
    Tally tally;
    KpScanConvert scan(0, 0, side - 1, side - 1);
    scan.setSpanCB(
        [](void* data, int xLeft, int xRight, int /*y*/) {
            auto& counted = *static_cast<Tally*>(data);
            ++counted.spans;
            counted.pixels += xRight - xLeft + 1;
        },
        &tally);
    scan.render(vertices, polygon.data());
    return tally;
}

void spans(benchmark::State& state)
{
    const std::vector<KpVec2f> polygon = star();
    Tally tally;
    for (auto _ : state)
        tally = scanned(polygon);
    if (tally.spans < side || tally.pixels > static_cast<long>(side) * side)
        state.SkipWithError("wrong spans");
    report(state, static_cast<double>(tally.spans), static_cast<double>(tally.pixels), "memset of its pixels");
}

void fill(benchmark::State& state)
{
    const Tally tally = scanned(star());
    std::vector<char> bytes(static_cast<size_t>(tally.pixels));
    for (auto _ : state) {
        std::memset(bytes.data(), 1, bytes.size());
        benchmark::ClobberMemory();
    }
    report(state, static_cast<double>(tally.spans), static_cast<double>(tally.pixels));
}

BENCHMARK(fill)->Name("memset of its pixels");
BENCHMARK(spans)->Name("KpScanConvert/1000 vertices");

}  // namespace
