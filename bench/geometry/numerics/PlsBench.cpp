#include <kplib/foundation/KpDArray.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/numerics/KpPls.h>

#include "support/Bench.h"

#include <cmath>
#include <random>

// Simplification of a noisy line of 100,000 points, to report.

namespace {

using kplib::bench::report;

constexpr int count = 100000;

KpDArray<KpVec2f> noisyLine()
{
    std::mt19937 random(1);
    std::uniform_real_distribution<float> noise(-1, 1);
    KpDArray<KpVec2f> points;
    for (int i = 0; i < count; ++i) {
        const auto x = static_cast<float>(i);
        points.append(KpVec2f(x, 500 * std::sin(x / 900) + noise(random)));
    }
    return points;
}

void douglasPeucker(benchmark::State& state)
{
    const auto points = noisyLine();
    KpDArray<KpVec2f> result;
    for (auto _ : state)
        KpPls::DouglasPeucker(points, 3, result);
    report(state, count, 0);
}

void reumannWitkam(benchmark::State& state)
{
    const auto points = noisyLine();
    KpDArray<KpVec2f> result;
    for (auto _ : state)
        KpPls::ReumannWitkam(points, 3, result);
    report(state, count, 0);
}

BENCHMARK(douglasPeucker);
BENCHMARK(reumannWitkam);

}  // namespace
