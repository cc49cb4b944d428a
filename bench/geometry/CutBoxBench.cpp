#include <support/Bench.h>

#include <kplib/geometry/KpCutBoxPlane.h>
#include <kplib/geometry/KpCutBoxPlaneDouble.h>
#include <kplib/geometry/KpPlane.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <numeric>
#include <random>
#include <vector>

// Parallel planes through one box, in shuffled order so that the number of vertices cannot be
// predicted, against a loop over the twelve edges, which finds the same vertices without their
// order.

using kplib::bench::report;

namespace {

constexpr int planes = 4096;
constexpr auto baselineName = "cut twelve edges";
const KpBox3f box(-10, 30, 5, 25, -40, 10), texture(0, 1, 0, 1, 0, 1);
const KpPlane through(KpVec3f(3, -2, 1.5F), 0.0F);

std::vector<float> shuffledDistances()
{
    float low, high;
    through.getDistance(box, low, high);
    std::vector<float> distances(planes);
    for (int i = 0; i < planes; ++i)
        distances[i] = low + (high - low) * (static_cast<float>(i) + 0.5F) / planes;
    std::shuffle(distances.begin(), distances.end(), std::mt19937(1));
    return distances;
}

int cutEdges(const std::array<float, 8>& values, float distance, KpVec3f* vertices, KpVec3f* secondVertices)
{
    int count = 0;
    for (int b = 0; b < 8; ++b)
        for (int bit = 1; bit < 8; bit <<= 1) {
            const int a = b | bit;
            if (a == b || (distance > values[a]) == (distance > values[b]))
                continue;
            const float t = (distance - values[b]) / (values[a] - values[b]);
            vertices[count] = box.corner(b) + (box.corner(a) - box.corner(b)) * t;
            secondVertices[count++] = texture.corner(b) + (texture.corner(a) - texture.corner(b)) * t;
        }
    return count;
}

// Runs `cut(distance)`, which gives a number of vertices, for all planes; checks the vertices' total.
template <typename Cut>
void measure(benchmark::State& state, Cut cut, const char* baseline, double limit)
{
    const std::vector<float> distances = shuffledDistances();
    int count = 0;
    for (auto _ : state) {
        count = 0;
        for (const float distance : distances)
            count += cut(distance);
        benchmark::ClobberMemory();
    }
    int expected = 0;
    for (const float distance : distances)
        for (int edge = 0; edge < 24; ++edge) {
            const int b = edge / 3, a = b ^ 1 << edge % 3;
            const auto isBelow = [&](int i) { return distance > box.corner(i).dot(through.normal()); };
            expected += isBelow(a) && !isBelow(b);
        }
    if (count != expected)
        state.SkipWithError("wrong number of vertices");
    report(state, planes, 0, baseline, limit);
    using benchmark::Counter;
    state.counters["a cut"] = Counter(planes, Counter::kIsIterationInvariantRate | Counter::kInvert);
}

void edges(benchmark::State& state)
{
    std::array<float, 8> values;
    for (int i = 0; i < 8; ++i)
        values[i] = box.corner(i).dot(through.normal());
    KpVec3f vertices[6], second[6];
    benchmark::DoNotOptimize(vertices);
    benchmark::DoNotOptimize(second);
    measure(
        state, [&](float distance) { return cutEdges(values, distance, vertices, second); }, "", 0);
}

void arrays(benchmark::State& state)
{
    const KpCutBoxPlane cutter(box, texture, through.normal());
    KpVec3f vertices[6], second[6];
    measure(
        state, [&](float distance) { return cutter.cutPlane(distance, vertices, second); }, baselineName, 0.9);
}

void arraysDouble(benchmark::State& state)
{
    double bounds[6], textureBounds[6];
    std::copy_n(box.data(), 6, bounds);
    std::copy_n(texture.data(), 6, textureBounds);
    const KpCutBoxPlaneDouble cutter(bounds, textureBounds, KpVec3d(through.normal()));
    KpVec3d vertices[6], second[6];
    measure(
        state, [&](float distance) { return cutter.cutPlane(distance, vertices, second); }, baselineName, 1);
}

void vectors(benchmark::State& state)
{
    const KpCutBoxPlane cutter(box, through.normal());
    measure(
        state, [&](float distance) { return static_cast<int>(cutter.cutPlane(distance).size()); }, baselineName, 0);
}

void oneShot(benchmark::State& state)
{
    KpVec3f vertices[6], second[6];
    KpPlane plane = through;
    const auto cut = [&](float distance) {
        plane.setDistanceFromOrigin(distance);
        return KpCutBoxPlane::cutPlane(box, texture, plane, vertices, second);
    };
    measure(state, cut, baselineName, 0);
}

}  // namespace

BENCHMARK(edges)->Name(baselineName);
BENCHMARK(arrays)->Name("KpCutBoxPlane/arrays, two boxes");
BENCHMARK(arraysDouble)->Name("KpCutBoxPlaneDouble/arrays, two boxes");
BENCHMARK(vectors)->Name("KpCutBoxPlane/vector");
BENCHMARK(oneShot)->Name("KpCutBoxPlane/one shot, two boxes");
