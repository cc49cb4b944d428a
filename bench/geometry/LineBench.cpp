#include <support/Bench.h>

#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpLine.h>

#include <algorithm>
#include <random>
#include <vector>

// Lines near a box and near a triangle, of which about half hit, against the shortest published
// tests, which return less: whether the box is hit, the weights of the triangle.

using kplib::bench::report;

namespace {

constexpr int lines = 4096;
const KpBox3f box(-1, 2, -1, 1, -2, 1);
const KpVec3f a(-2, -1, 0.3F), b(2, -1, -0.2F), c(0, 2, 0.1F);

std::vector<KpLine> someLines()
{
    std::mt19937 random(3);
    std::uniform_real_distribution<float> places(-2, 2);
    std::vector<KpLine> result(lines);
    for (KpLine& line : result) {
        const KpVec3f from(places(random), places(random), places(random) - 10);
        line.setValue(from, KpVec3f(places(random), places(random), 5));
    }
    return result;
}

bool slabs(const KpLine& line)
{
    float entry = -1e38F, exit = 1e38F;
    for (int axis = 0; axis < 3; ++axis) {
        const float inverse = 1 / line.direction()[axis];
        const float low = (box[2 * axis] - line.position()[axis]) * inverse;
        const float high = (box[2 * axis + 1] - line.position()[axis]) * inverse;
        entry = std::max(entry, std::min(low, high));
        exit = std::min(exit, std::max(low, high));
    }
    return entry <= exit;
}

// Moller and Trumbore, "Fast, minimum storage ray/triangle intersection", 1997.
bool triangle(const KpLine& line)
{
    const KpVec3f e = b - a, f = c - a, g = line.position() - a, p = line.direction().cross(f);
    const float inverse = 1 / e.dot(p), alpha = g.dot(p) * inverse;
    const float beta = g.cross(e).dot(line.direction()) * inverse;
    return alpha >= 0 && beta >= 0 && alpha + beta <= 1;
}

// Counts the lines for which `hits` is true; they have to be as many as those for which `reference` is.
template <typename Hits>
void measure(benchmark::State& state, Hits hits, bool (*reference)(const KpLine&), const char* baseline)
{
    const std::vector<KpLine> all = someLines();
    long count = 0;
    for (auto _ : state) {
        count = std::count_if(all.begin(), all.end(), hits);
        benchmark::DoNotOptimize(count);
    }
    if (count != std::count_if(all.begin(), all.end(), reference))
        state.SkipWithError("wrong number of hits");
    report(state, lines, 0, baseline);
}

bool hitsBox(const KpLine& line)
{
    KpVec3f enter, exit;
    return line.intersect(box, enter, exit, 1e-4F);
}

bool hitsTriangle(const KpLine& line)
{
    KpVec3f hit, barycentric;
    bool front;
    return line.intersect(a, b, c, hit, barycentric, front);
}

}  // namespace

BENCHMARK_CAPTURE(measure, , slabs, slabs, "")->Name("slabs, yes or no");
BENCHMARK_CAPTURE(measure, , triangle, triangle, "")->Name("triangle, weights alone");
BENCHMARK_CAPTURE(measure, , hitsBox, slabs, "slabs, yes or no")->Name("KpLine/box");
BENCHMARK_CAPTURE(measure, , hitsTriangle, triangle, "triangle, weights alone")->Name("KpLine/triangle");
