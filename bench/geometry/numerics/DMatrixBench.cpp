#include "support/Bench.h"

#include <kplib/geometry/numerics/KpDMatrix.h>
#include <kplib/geometry/numerics/detail/LinearSolver.h>

#include <Eigen/Dense>

#include <cmath>
#include <random>
#include <vector>

using namespace kplib::bench;

namespace {

using EigenMatrix = Eigen::Matrix<float, Eigen::Dynamic, Eigen::Dynamic, Eigen::RowMajor>;

constexpr int count = 64;  // of matrices in turn: no two take the same way

EigenMatrix noise(int rows, int cols)
{
    static std::mt19937 random(1);
    std::uniform_real_distribution<float> number(-2, 2);
    return EigenMatrix::NullaryExpr(rows, cols, [&] { return number(random); });
}

KpDMatrix<float> toKp(const EigenMatrix& matrix)
{
    KpDMatrix<float> result(static_cast<int>(matrix.rows()), static_cast<int>(matrix.cols()));
    std::copy_n(matrix.data(), matrix.size(), result.data());
    return result;
}

template <typename EigenForm>
void eigenSvd(benchmark::State& state, int rows)
{
    std::vector<EigenForm> matrices;
    for (int i = 0; i < count; ++i)
        matrices.push_back(noise(rows, 3));
    int i = 0;
    for (auto _ : state) {
        Eigen::JacobiSVD<EigenForm> svd(matrices[static_cast<std::size_t>(++i % count)],
                                        rows == 3 ? Eigen::ComputeFullU | Eigen::ComputeFullV
                                                  : Eigen::ComputeThinU | Eigen::ComputeThinV);
        benchmark::DoNotOptimize(svd);
    }
    report(state, 1, 12.0 * rows);
}

void kpSvd(benchmark::State& state, int rows, const std::string& baseline, double limit)
{
    std::vector<KpDMatrix<float>> matrices;
    EigenMatrix last;
    for (int i = 0; i < count; ++i) {
        last = noise(rows, 3);
        matrices.push_back(toKp(last));
    }
    KpDMatrix<float> u, v;
    float w[3];
    int i = 0;
    for (auto _ : state) {
        matrices[static_cast<std::size_t>(++i % count)].SVD(u, w, v, 30);
        benchmark::DoNotOptimize(w);
    }
    matrices.back().SVD(u, w, v, 30);
    const Eigen::JacobiSVD<EigenMatrix> reference(last);
    if (std::abs(*std::max_element(w, w + 3) - reference.singularValues()[0]) > 1e-4F * w[0])
        state.SkipWithError("wrong singular value");
    report(state, 1, 12.0 * rows, baseline, limit);
}

void eigenSolve(benchmark::State& state, int n)
{
    const EigenMatrix matrix = noise(n, n) + 2 * EigenMatrix::Identity(n, n), side = noise(n, 1);
    for (auto _ : state) {
        Eigen::VectorXf x = matrix.partialPivLu().solve(side);
        benchmark::DoNotOptimize(x.data());
    }
    report(state, 1, 4.0 * n * n);
}

void kpSolve(benchmark::State& state, int n, const std::string& baseline, double limit)
{
    const EigenMatrix matrix = noise(n, n) + 2 * EigenMatrix::Identity(n, n), side = noise(n, 1);
    const KpDMatrix<float> a = toKp(matrix);
    std::vector<float> x(static_cast<std::size_t>(n));
    for (auto _ : state) {
        std::copy_n(side.data(), n, x.data());
        float* sides[] = {x.data()};
        if (a.solveLRdecomp(sides, 1) != 0)
            state.SkipWithError("not solved");
        benchmark::ClobberMemory();
    }
    if (!((matrix * Eigen::Map<Eigen::VectorXf>(x.data(), n) - side).norm() < 1e-4F * side.norm()))
        state.SkipWithError("wrong solution");
    report(state, 1, 4.0 * n * n, baseline, limit);
}

void eliminate(benchmark::State& state, kplib::detail::EliminateLoop* run, const std::string& baseline)
{
    constexpr int n = 100;
    KpDMatrix<float> a = toKp(noise(n, n));
    std::vector<float*> rows;
    for (int i = 0; i < n; ++i)
        rows.push_back(a[i]);
    a[0][0] = 1e20F;  // so that what is eliminated again and again stays as it is
    for (auto _ : state) {
        run(rows.data(), 0, n);
        benchmark::ClobberMemory();
    }
    report(state, 1, 4.0 * n * n, baseline);
}

const bool added = [] {
    using benchmark::RegisterBenchmark;
    const std::string svd3 = "SVD 3x3/Eigen JacobiSVD", svd100 = "SVD 100x3/Eigen JacobiSVD";
    RegisterBenchmark(svd3.c_str(), eigenSvd<Eigen::Matrix3f>, 3);
    RegisterBenchmark("SVD 3x3/KpDMatrix", kpSvd, 3, svd3, 1);
    RegisterBenchmark(svd100.c_str(), eigenSvd<EigenMatrix>, 100);
    RegisterBenchmark("SVD 100x3/KpDMatrix", kpSvd, 100, svd100, 0);
    for (const int n : {3, 30, 100, 300}) {
        const std::string name = "solve " + std::to_string(n), baseline = name + "/Eigen partialPivLu";
        RegisterBenchmark(baseline.c_str(), eigenSolve, n);
        RegisterBenchmark((name + "/KpDMatrix").c_str(), kpSolve, n, baseline, n == 100 ? 2 : 0);
    }
    for (const auto& path : kplib::detail::eliminatePaths()) {
        const std::string name = std::string("eliminate 100/") + path.name;
        if (path.usable)
            RegisterBenchmark(name.c_str(), eliminate, path.run,
                              path.name == std::string("plain") ? "" : "eliminate 100/plain");
    }
    return true;
}();

}  // namespace
