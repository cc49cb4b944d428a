#include <support/Bench.h>

#include <kplib/volume/KpMorphology.h>

#include <algorithm>
#include <cmath>

// Fills a shape like a brain: an ellipsoid with deep folds. The limit is 0.7 nanoseconds for each
// filled voxel, measured as items per second.

using namespace kplib::bench;

namespace {

constexpr int dims[] = {181, 217, 181};

/// Folds about 20 voxels apart and 4 wide, up to a third of the radius deep.
KpBitfield brain()
{
    KpBitfield field(181UL * 217 * 181, KpBitfield::INIT_UNSET);
    unsigned long i = 0;
    for (int z = 0; z < dims[2]; ++z)
        for (int y = 0; y < dims[1]; ++y)
            for (int x = 0; x < dims[0]; ++x, ++i) {
                const double u = x / 90.0 - 1, v = y / 108.0 - 1, w = z / 90.0 - 1;
                const double depth = 0.8 - std::sqrt(u * u + v * v + w * w);
                const double fold = std::sin(0.15 * x + 2 * std::sin(0.04 * z)) +
                                    std::sin(0.14 * y + std::sin(0.06 * x)) +
                                    std::sin(0.15 * z + 2 * std::sin(0.05 * y));
                if (depth > 0 && std::abs(fold) > 0.3 - depth)
                    field.set(i);
            }
    return field;
}

void floodfillBrain(benchmark::State& state)
{
    const KpBitfield src = brain();
    KpBitfield dst(src);
    unsigned long count = 0, runs = 0;
    for (unsigned long i = 1; i < src.nBits(); ++i)
        runs += src.test(i) && !src.test(i - 1);
    for (auto _ : state) {
        dst.unsetAll();
        count = KpMorphology::floodfill(src, dst, {{90, 108, 90}}, true, dims, nullptr);
    }
    report(state, static_cast<double>(count), static_cast<double>(src.nBits()) / 8);
    state.counters["voxels/run"] = static_cast<double>(src.nSetBits()) / static_cast<double>(runs);
}
BENCHMARK(floodfillBrain);

}  // namespace
