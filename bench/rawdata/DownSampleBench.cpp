#include "Volumes.h"

#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/KpDownSampleKernels.h>

// Down-sampling of 512 x 512 x 256 elements against a copy of the bytes read and written.

using namespace kplib::bench;
using namespace kplib::detail;

namespace {

struct Job {
    const char* what;
    BlockRule rule;
    int fx, fy, fz, n;
    double limit;
};

template <typename T>
struct Volume {
    long dx, dy = 512, dz = 256;
    explicit Volume(int n) : dx(512 / n) {}
};

/// One voxel of the result by its definition.
template <typename T>
bool isRight(const Job& job, const T* dst, const T* src, long dx, long dy)
{
    const long nx = dx / job.fx, ny = dy / job.fy, i = nx / 2, j = ny / 3, k = 5;
    double sum = 0, greatest = -1e9;
    for (long z = k * job.fz; z < (k + 1) * job.fz; ++z)
        for (long y = j * job.fy; y < (j + 1) * job.fy; ++y)
            for (long x = i * job.fx; x < (i + 1) * job.fx; ++x) {
                const double v = src[((z * dy + y) * dx + x) * job.n];
                sum += v;
                greatest = std::max(greatest, v);
            }
    const double mean = sum / (job.fx * job.fy * job.fz);
    return dst[((k * ny + j) * nx + i) * job.n] == static_cast<T>(job.rule == BlockRule::Mean ? mean : greatest);
}

template <typename T, typename Run>
void downSample(benchmark::State& state, const Job& job, Run run)
{
    const long dx = 512 / job.n, dy = 512, dz = 256, n = dx * dy * dz * job.n;
    const long made = (dx / job.fx) * (dy / job.fy) * (dz / job.fz) * job.n, size = sizeof(T);
    const Memory src = noise<T>(n), dst = touched(made * size);
    auto* from = reinterpret_cast<T*>(src.get());
    for (auto _ : state) {
        run(dst.get(), from, dx, dy, dz);
        benchmark::ClobberMemory();
    }
    if (!isRight(job, reinterpret_cast<T*>(dst.get()), from, dx, dy))
        state.SkipWithError("wrong voxel");
    report(state, static_cast<double>(n), static_cast<double>((n + made) * size), copyOf(512L * 512 * 256 * 2 * size),
           job.limit * static_cast<double>(n + made) / (512.0 * 512 * 256 * 2));
}

template <typename T>
void addJobs(const std::string& type)
{
    copyBaseline(512L * 512 * 256 * 2 * static_cast<long>(sizeof(T)));
    const Job jobs[] = {
        {"downSample3D/2,2,2", BlockRule::Mean, 2, 2, 2, 1, 1.7},   {"downSample3D/4,4,2", BlockRule::Mean, 4, 4, 2, 1, 1.8},
        {"downSample3D/3,3,1", BlockRule::Mean, 3, 3, 1, 1, 0},     {"downSample3DN/2,2,2x3", BlockRule::Mean, 2, 2, 2, 3, 2.5},
        {"maximum/2,2,2", BlockRule::Maximum, 2, 2, 2, 1, 2.5},     {"maximum/2,2,2x3", BlockRule::Maximum, 2, 2, 2, 3, 2.5},
    };
    for (const Job& job : jobs) {
        add(std::string(job.what) + "/" + type, [job](benchmark::State& state) {
            downSample<T>(state, job, [&](void* dst, T* src, long dx, long dy, long dz) {
                (job.rule == BlockRule::Mean ? KpRawData::downSample3DN : KpRawData::downSampleMaxFilterComponents3DN)(
                    dst, src, dx, dy, dz, job.fx, job.fy, job.fz, job.n, nullptr);
            });
        });
    }
}
}  // namespace
