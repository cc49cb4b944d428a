#include <geometry/numerics/PlainDelaunay.h>
#include <support/Bench.h>

#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/geometry/numerics/KpDelaunay.h>

#include <CGAL/Delaunay_triangulation_2.h>
#include <CGAL/Delaunay_triangulation_3.h>
#include <CGAL/Exact_predicates_inexact_constructions_kernel.h>

#include <limits>
#include <random>
#include <string>
#include <type_traits>
#include <vector>

// Points at random in a square and in a cube, in no order: against a triangulation by walks and exact tests that takes
// the points in the same order, and against the insertion that asks every circle, whose result has to be the same.

using kplib::bench::report;
using namespace kplib::detail::delaunay;
using Kernel = CGAL::Exact_predicates_inexact_constructions_kernel;

namespace {

template <typename Vector>
std::vector<Vector> noise(long n)
{
    std::mt19937 random(11);
    std::uniform_real_distribution<float> places(0, 1);
    std::vector<Vector> points(n);
    for (Vector& p : points)
        for (float& x : p)
            x = places(random);
    return points;
}

auto library(std::vector<KpVec2f>& points, KpDArray<KpDelaunay::Triangle>& result)
{
    return KpDelaunay::triangulate2D(points.data(), static_cast<int>(points.size()), result);
}

auto library(std::vector<KpVec3f>& points, KpDArray<KpDelaunay::Tetrahedron>& result)
{
    return KpDelaunay::triangulate3D(points.data(), static_cast<int>(points.size()), result);
}

long walks(const std::vector<KpVec2f>& points)
{
    CGAL::Delaunay_triangulation_2<Kernel> mesh;
    for (const KpVec2f& p : points)
        mesh.insert({p.x(), p.y()});
    return static_cast<long>(mesh.number_of_faces());
}

long walks(const std::vector<KpVec3f>& points)
{
    CGAL::Delaunay_triangulation_3<Kernel> mesh;
    for (const KpVec3f& p : points)
        mesh.insert({p.x(), p.y(), p.z()});
    return static_cast<long>(mesh.number_of_finite_cells());
}

template <typename Vector>
void measureWalks(benchmark::State& state)
{
    const auto points = noise<Vector>(state.range(0));
    for (auto _ : state)
        benchmark::DoNotOptimize(walks(points));
    report(state, static_cast<double>(points.size()), 0);
}

/// Walks keep the thin parts at the hull, which the library leaves out.
template <typename Vector>
void measure(benchmark::State& state, const std::string& baseline, double limit)
{
    auto points = noise<Vector>(state.range(0));
    KpDArray<Simplex<Vector::size()>> result;
    for (auto _ : state)
        if (!library(points, result))
            state.SkipWithError("no room");
    const long expected = walks(points);
    if (result.size() > expected || result.size() < expected - expected / 100 - 50)
        state.SkipWithError("wrong number");
    report(state, static_cast<double>(points.size()), 0, baseline + std::to_string(points.size()), limit);
}

template <int Size>
PointSet<Size> noiseSet(long n)
{
    const auto points = noise<std::conditional_t<Size == 2, KpVec2f, KpVec3f>>(n);
    return shifted<Size>(points[0].data(), static_cast<int>(n));
}

template <int Size>
void measurePlain(benchmark::State& state)
{
    const auto set = noiseSet<Size>(state.range(0));
    for (auto _ : state)
        benchmark::DoNotOptimize(kplib::test::plainDelaunay<Size>(set, CavityRim<Size>::limit));
    report(state, static_cast<double>(set.n), 0);
}

template <int Size>
void measureFinder(benchmark::State& state, const Finder& finder, const std::string& baseline, double limit)
{
    const auto set = noiseSet<Size>(state.range(0));
    KpDArray<Simplex<Size>> result;
    for (auto _ : state)
        benchmark::DoNotOptimize(triangulate<Size>(set, finder, result));
    if (set.n <= 3000) {
        const auto expected = *kplib::test::plainDelaunay<Size>(set, CavityRim<Size>::limit);
        if (!std::equal(expected.begin(), expected.end(), result.begin(), result.end()))
            state.SkipWithError("another result");
    }
    report(state, static_cast<double>(set.n), 0, baseline + std::to_string(set.n), set.n == 50000 ? limit : 0);
}

using Counts = std::initializer_list<long>;

template <typename... Args>
void add(const std::string& name, Counts counts, Args... args)
{
    auto* const run = benchmark::RegisterBenchmark(name.c_str(), args...);
    for (const long n : counts)
        run->Arg(n);
    run->Unit(benchmark::kMillisecond);
}

template <typename Vector, int Size = Vector::size()>
void addAll(const std::string& space, double limit, Counts called, Counts plain)
{
    add("walks " + space, called, measureWalks<Vector>);
    add("KpDelaunay/triangulate" + space, called, measure<Vector>, "walks " + space + '/', limit);
    const std::string loop = "plain loop " + space;
    add(loop, plain, measurePlain<Size>);
    for (const auto& path : circleScanPaths<Size>())
        if (path.usable)
            add("scan " + space + ' ' + path.name, plain, measureFinder<Size>,
                Finder{path.run, std::numeric_limits<long>::max()}, loop + '/', 0);
    add("grid " + space, plain, measureFinder<Size>, Finder{bestFinder<Size>().scan, 0}, loop + '/', 0);
    add("both " + space, plain, measureFinder<Size>, bestFinder<Size>(), loop + '/', 1 / 40.0);
}

const int registered = [] {
    addAll<KpVec2f>("2D", 4, {1000, 10000, 100000}, {1000, 3000, 10000, 50000});
    addAll<KpVec3f>("3D", 6, {1000, 10000}, {1000, 3000, 10000});
    return 0;
}();

}  // namespace
