#include "support/Bench.h"

#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/detail/Mat4fKernels.h>

#include <Eigen/Dense>

#include <cmath>
#include <cstring>
#include <random>
#include <vector>

// Small objects are worked through in arrays that fit in the first cache, so that what counts is the work and not the
// wait for one result.

using namespace kplib::bench;

namespace {

using EigenMat4f = Eigen::Matrix<float, 4, 4, Eigen::RowMajor>;
constexpr std::size_t count = 128;
constexpr long manyPoints = 10'000'000, fewPoints = 1000;

float number()
{
    static std::mt19937 random(1);
    return std::uniform_real_distribution<float>(-2, 2)(random);
}

KpMat4f affine()
{
    KpMat4f matrix;
    matrix.setTransform(KpVec3f(number(), number(), number()), KpRotation(number(), number(), number(), 1),
                        KpVec3f(1.5F, 0.5F, 2), KpRotation(number(), 1, number(), number()));
    return matrix;
}

template <typename Make>
auto many(Make make)
{
    std::vector<decltype(make())> objects(count);
    for (auto& object : objects)
        object = make();
    return objects;
}

EigenMat4f toEigen(const KpMat4f& matrix)
{
    EigenMat4f result;
    std::memcpy(result.data(), matrix.data(), sizeof matrix);
    return result;
}

std::vector<EigenMat4f> toEigen(const std::vector<KpMat4f>& matrices)
{
    std::vector<EigenMat4f> results;
    for (const KpMat4f& matrix : matrices)
        results.push_back(toEigen(matrix));
    return results;
}

/// Measures work(i) on each of the objects.
template <typename Work>
void each(benchmark::State& state, double bytes, const std::string& baseline, double limit, Work work)
{
    for (auto _ : state) {
        for (std::size_t i = 0; i < count; ++i)
            work(i);
        benchmark::ClobberMemory();
    }
    report(state, count, count * bytes, baseline, limit);
}

KpMat4f plainProduct(const KpMat4f& a, const KpMat4f& b)
{
    KpMat4f c;
    for (int i = 0; i < 4; ++i) {
        for (int j = 0; j < 4; ++j) {
            float sum = a[i][0] * b[0][j];
            for (int k = 1; k < 4; ++k)
                sum += a[i][k] * b[k][j];
            c[i][j] = sum;
        }
    }
    return c;
}

const std::string plainMatrixProduct = "KpMat4f product/plain", eigenMatrixProduct = "KpMat4f product/Eigen";

void addProducts()
{
    static const auto a = many(affine), b = many(affine);
    static const auto eigenA = toEigen(a), eigenB = toEigen(b);
    static std::vector<KpMat4f> c(count);
    static std::vector<EigenMat4f> eigenC(count);
    benchmark::RegisterBenchmark(plainMatrixProduct.c_str(), [](benchmark::State& state) {
        each(state, 192, "", 0, [](std::size_t i) { c[i] = plainProduct(a[i], b[i]); });
    });
    benchmark::RegisterBenchmark(eigenMatrixProduct.c_str(), [](benchmark::State& state) {
        each(state, 192, "", 0, [](std::size_t i) { eigenC[i].noalias() = eigenA[i] * eigenB[i]; });
    });
    for (const std::string& baseline : {plainMatrixProduct, eigenMatrixProduct}) {
        benchmark::RegisterBenchmark(("KpMat4f product/vs " + baseline).c_str(), [=](benchmark::State& state) {
            each(state, 192, baseline, 1, [](std::size_t i) { c[i] = a[i] * b[i]; });
            if (!(c[7] == plainProduct(a[7], b[7])))
                state.SkipWithError("wrong product");
        });
    }
}

void addInverses()
{
    static const auto matrices = many(affine);
    static const auto projective = many([] {
        KpMat4f matrix = affine();
        matrix[0][3] = number();
        return matrix;
    });
    static const auto eigenMatrices = toEigen(matrices);
    static std::vector<KpMat4f> inverses(count);
    static std::vector<EigenMat4f> eigenInverses(count);
    benchmark::RegisterBenchmark("KpMat4f inverse/Eigen", [](benchmark::State& state) {
        each(state, 128, "", 0, [](std::size_t i) { eigenInverses[i] = eigenMatrices[i].inverse(); });
    });
    const auto add = [](const char* name, const std::vector<KpMat4f>& from, double limit) {
        benchmark::RegisterBenchmark(name, [&from, limit](benchmark::State& state) {
            each(state, 128, "KpMat4f inverse/Eigen", limit, [&](std::size_t i) { inverses[i] = from[i].inverse(); });
            if (!(from[7] * inverses[7]).equals(KpMat4f::identity(), 1e-4F))
                state.SkipWithError("wrong inverse");
        });
    };
    add("KpMat4f inverse/affine", matrices, 1.5);
    add("KpMat4f inverse/projective", projective, 0);
}

void addEigenvalues()
{
    static const auto matrices = many([] {
        const KpMat3f m(number(), number(), number(), number(), number(), number(), number(), number(), number());
        return m * m.transpose();
    });
    static std::vector<KpMat4f> larger;
    static std::vector<Eigen::Matrix3f> eigenMatrices;
    for (const KpMat3f& matrix : matrices) {
        larger.emplace_back(matrix);
        eigenMatrices.emplace_back(Eigen::Map<const Eigen::Matrix3f>(matrix.data()));
    }
    static float evalues[count][3], rows[count][3][3];
    static KpVec3f evectors[count][3];
    const auto isRight = [](std::size_t i, const KpVec3f& first) {
        const KpVec3f turned = matrices[i].multMatrixVec(first), scaled = first * evalues[i][0];
        return (turned - scaled).length() < 1e-4F;
    };
    // In one rotation three roots and three divisions wait for one another, and each rotation for the one before; the
    // closed formula of the baseline is faster than that can be.
    static const std::string baseline = "symmetric 3x3/Eigen computeDirect";
    benchmark::RegisterBenchmark(baseline.c_str(), [](benchmark::State& state) {
        static std::vector<Eigen::SelfAdjointEigenSolver<Eigen::Matrix3f>> solvers(count);
        each(state, 84, "", 0, [](std::size_t i) { solvers[i].computeDirect(eigenMatrices[i]); });
    });
    benchmark::RegisterBenchmark("symmetric 3x3/KpMat3f::jacobi", [=](benchmark::State& state) {
        int rotations;
        each(state, 84, baseline, 5, [&](std::size_t i) { matrices[i].jacobi(evalues[i], evectors[i], rotations); });
        if (!isRight(7, evectors[7][0]))
            state.SkipWithError("wrong vector");
    });
    benchmark::RegisterBenchmark("symmetric 3x3/KpMat4f::jacobi3", [=](benchmark::State& state) {
        int rotations;
        each(state, 84, baseline, 5, [&](std::size_t i) { larger[i].jacobi3(evalues[i], rows[i], rotations); });
        if (!isRight(7, KpVec3f(rows[7][0][0], rows[7][1][0], rows[7][2][0])))
            state.SkipWithError("wrong vector");
    });
}

/// `run(points, results)` transforms `n` points by `matrix`.
template <typename Run>
void transform(benchmark::State& state, const KpMat4f& matrix, long n, const std::string& baseline, double limit,
               Run run)
{
    std::vector<KpVec3f> points(static_cast<std::size_t>(n)), results = points;
    for (KpVec3f& point : points)
        point = KpVec3f(number(), number(), number());
    for (auto _ : state) {
        run(points, results.data());
        benchmark::ClobberMemory();
    }
    if (!baseline.empty() && !(results.back() == matrix.multVecMatrix(points.back())))
        state.SkipWithError("wrong point");
    report(state, static_cast<double>(n), static_cast<double>(n) * 24, baseline, limit);
}

void addPoints()
{
    static const KpMat4f matrix = affine();
    for (const long n : {manyPoints, fewPoints}) {
        const std::string size = n == manyPoints ? "/10M" : "/1000";
        const std::string copy = "points/memcpy" + size;
        benchmark::RegisterBenchmark(copy.c_str(), [=](benchmark::State& state) {
            transform(state, matrix, n, "", 0, [](const auto& points, KpVec3f* results) {
                std::memcpy(static_cast<void*>(results), points.data(), points.size() * sizeof(KpVec3f));
            });
        });
        benchmark::RegisterBenchmark(("points/multVecMatrix" + size).c_str(), [=](benchmark::State& state) {
            transform(state, matrix, n, copy, n == manyPoints ? 1.5 : 0,
                      [](const auto& points, KpVec3f* results) { matrix.multVecMatrix(points, results); });
        });
        for (const auto& path : kplib::detail::transformPaths()) {
            if (!path.usable)
                continue;
            const std::string name = std::string("points/kernel ") + path.name + size;
            benchmark::RegisterBenchmark(name.c_str(), [=](benchmark::State& state) {
                transform(state, matrix, n, copy, 0, [=](const auto& points, KpVec3f* results) {
                    path.run(matrix.data(), points.data()->data(), results->data(), n);
                });
            });
        }
    }
}

void addRotations()
{
    static const auto rotate = [] { return KpRotation(number(), number(), number(), number()); };
    static const auto toQuaternion = [](const KpRotation& r) { return Eigen::Quaternionf(r[3], r[0], r[1], r[2]); };
    static const auto a = many(rotate), b = many(rotate);
    static const auto points = many([] { return KpVec3f(number(), number(), number()); });
    static std::vector<Eigen::Quaternionf> eigenA, eigenB, eigenC(count);
    static std::vector<Eigen::Vector3f> eigenPoints;
    for (std::size_t i = 0; i < count; ++i) {
        eigenA.push_back(toQuaternion(a[i]));
        eigenB.push_back(toQuaternion(b[i]));
        eigenPoints.emplace_back(points[i][0], points[i][1], points[i][2]);
    }
    static std::vector<KpRotation> c(count);
    static std::vector<KpVec3f> turned(count);
    static std::vector<Eigen::Vector3f> eigenTurned(count);
    const auto add = [](const std::string& name, auto eigenWork, auto work) {
        const std::string baseline = "KpRotation " + name + "/Eigen";
        benchmark::RegisterBenchmark(baseline.c_str(),
                                     [=](benchmark::State& state) { each(state, 48, "", 0, eigenWork); });
        benchmark::RegisterBenchmark(("KpRotation " + name).c_str(),
                                     [=](benchmark::State& state) { each(state, 48, baseline, 0, work); });
    };
    add(
        "product", [](std::size_t i) { eigenC[i] = eigenB[i] * eigenA[i]; }, [](std::size_t i) { c[i] = a[i] * b[i]; });
    add(
        "multVec", [](std::size_t i) { eigenTurned[i] = eigenA[i]._transformVector(eigenPoints[i]); },
        [](std::size_t i) { turned[i] = a[i].multVec(points[i]); });
    add(
        "slerp", [](std::size_t i) { eigenC[i] = eigenA[i].slerp(0.3F, eigenB[i]); },
        [](std::size_t i) { c[i] = KpRotation::slerp(a[i], b[i], 0.3F); });
}

const bool added = [] {
    addProducts();
    addInverses();
    addEigenvalues();
    addPoints();
    addRotations();
    return true;
}();

}  // namespace
