#include "support/Bench.h"

#include <kplib/geometry/numerics/KpODE3.h>

#include <cmath>

using namespace kplib::bench;

namespace {

// Steps are held against the field itself, of which each method has its number of evaluations.
const std::string evaluation = "KpODE3/one evaluation of the field";

void evaluate(benchmark::State& state)
{
    KpVec3f x(1, 0, 0), derivative;
    const auto field = KpODE3::defaultRightHandSide;
    for (auto _ : state) {
        benchmark::DoNotOptimize(x);
        field(x, derivative, nullptr);
        derivative *= static_cast<float>(1 / std::sqrt(static_cast<double>(derivative.squaredLength())));
        benchmark::DoNotOptimize(derivative);
    }
    report(state, 1, 12);
}

using Attempt = int (KpODE3::*)(KpVec3f&, KpVec3f&, KpVec3f&) const;

void step(benchmark::State& state, Attempt attempt)
{
    KpODE3 ode;
    ode.init(KpVec3f(1, 0, 1), 0.1F);
    KpVec3f y, f, error;
    for (auto _ : state) {
        (ode.*attempt)(y, f, error);
        benchmark::DoNotOptimize(y);
    }
    if (!(error.length() < 0.02F))
        state.SkipWithError("wrong step");
    report(state, 1, 12, evaluation);
}

const bool added = [] {
    benchmark::RegisterBenchmark(evaluation.c_str(), evaluate);
    benchmark::RegisterBenchmark("KpODE3/rk21", step, &KpODE3::rk21);
    benchmark::RegisterBenchmark("KpODE3/rk32", step, &KpODE3::rk32);
    benchmark::RegisterBenchmark("KpODE3/rk43", step, &KpODE3::rk43);
    benchmark::RegisterBenchmark("KpODE3/rk54", step, &KpODE3::rk54);
    benchmark::RegisterBenchmark("KpODE3/rkck", step, &KpODE3::rkck);
    return true;
}();

}  // namespace
