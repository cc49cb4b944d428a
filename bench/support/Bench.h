#pragma once

#include <benchmark/benchmark.h>

#include <string>

namespace kplib::bench {

/// Work of one iteration, and the name of the benchmark of the same run that this one is held against; bench/report
/// divides the two times. A baseline itself gives an empty name. `limit`: the ratio that this kernel has to keep, 0 for
/// none.
inline void report(benchmark::State& state, double items, double bytes, const std::string& baseline = "",
                   double limit = 0)
{
    state.SetItemsProcessed(static_cast<int64_t>(items * static_cast<double>(state.iterations())));
    state.SetBytesProcessed(static_cast<int64_t>(bytes * static_cast<double>(state.iterations())));
    if (!baseline.empty())
        state.SetLabel("vs " + baseline);
    if (limit > 0)
        state.counters["limit"] = limit;
}

}  // namespace kplib::bench
