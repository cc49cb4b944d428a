#include "support/Bench.h"

#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/numerics/KpAlignPointSets.h>

#include <cstring>
#include <random>
#include <vector>

using namespace kplib::bench;

namespace {

constexpr int pairs = 100'000;
const std::string copying = "kpAlignPointSets 100000/memcpy of both lists";

std::vector<KpVec3f> cloud()
{
    std::mt19937 random(1);
    std::uniform_real_distribution<float> number(-100, 100);
    std::vector<KpVec3f> points(pairs);
    for (KpVec3f& point : points)
        point = KpVec3f(number(random), number(random), number(random));
    return points;
}

void copyBoth(benchmark::State& state)
{
    const auto points1 = cloud(), points2 = cloud();
    std::vector<KpVec3f> to1(pairs), to2(pairs);
    for (auto _ : state) {
        std::memcpy(to1.data()->data(), points1.data(), pairs * sizeof(KpVec3f));
        std::memcpy(to2.data()->data(), points2.data(), pairs * sizeof(KpVec3f));
        benchmark::ClobberMemory();
    }
    report(state, pairs, 24.0 * pairs);
}

void align(benchmark::State& state, int mode, double limit)
{
    const auto points2 = cloud();
    auto points1 = points2;
    KpMat4f motion, result;
    motion.setTransform(KpVec3f(1, 2, 3), KpRotation(0.1F, 0.2F, 0.3F, 1), KpVec3f(1, 1, 1), KpRotation(0, 0, 0, 1));
    motion.multVecMatrix(points2, points1.data());
    for (auto _ : state) {
        kpAlignPointSets(result, points1.data(), points2.data(), pairs, mode);
        benchmark::DoNotOptimize(result);
    }
    if (!result.equals(motion, 1e-2F))
        state.SkipWithError("wrong motion");
    report(state, pairs, 24.0 * pairs, copying, limit);
}

const bool added = [] {
    benchmark::RegisterBenchmark(copying.c_str(), copyBoth);
    benchmark::RegisterBenchmark("kpAlignPointSets 100000/rigid", align, 0, 3);
    benchmark::RegisterBenchmark("kpAlignPointSets 100000/rigid with scale", align, 1, 0);
    benchmark::RegisterBenchmark("kpAlignPointSets 100000/affine", align, 2, 0);
    return true;
}();

}  // namespace
