#include "Volumes.h"

#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/DownSampleKernels.h>

#include <algorithm>
#include <type_traits>

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

struct Sizes {
    explicit Sizes(const Job& job) : dx(512 / job.n), n(dx * dy * dz * job.n)
    {
        made = (dx / job.fx) * (dy / job.fy) * (dz / job.fz) * job.n;
    }
    long dx, dy = 512, dz = 256, n = 0, made = 0;
};

/// Measures `run(dst, src, sizes)`.
template <typename T, typename Run>
void downSample(benchmark::State& state, const Job& job, const std::string& baseline, double limit, Run run)
{
    const Sizes sizes(job);
    const long count = turns(sizes.n * static_cast<long>(sizeof(T)));
    const Memory src = noise<T>(sizes.n * count), dst = touched(sizes.made * static_cast<long>(sizeof(T)));
    auto* const volumes = reinterpret_cast<T*>(src.get());
    T* from = volumes;
    long turn = 0;
    for (auto _ : state) {
        from = volumes + turn * sizes.n;
        run(dst.get(), from, sizes);
        benchmark::ClobberMemory();
        turn = (turn + 1) % count;
    }
    if (!isRight(job, reinterpret_cast<T*>(dst.get()), from, sizes.dx, sizes.dy))
        state.SkipWithError("wrong voxel");
    report(state, static_cast<double>(sizes.n), static_cast<double>(sizes.n + sizes.made) * sizeof(T), baseline, limit);
}

template <typename T>
void runPath(BlockLoop* loop, const Job& job, char* dst, const T* src, const Sizes& s)
{
    const long row = s.dx * job.n, slice = row * s.dy, blocks = s.dx / job.fx;
    for (long k = 0; k < s.dz / job.fz; ++k)
        for (long j = 0; j < s.dy / job.fy; ++j, dst += blocks * job.n * static_cast<long>(sizeof(T)))
            loop({src + k * job.fz * slice + j * job.fy * row, dst, blocks, job.fx, job.fy, job.fz, job.n, row, slice});
}

template <typename T>
void addJobs(const std::string& type)
{
    const Job jobs[] = {
        {"downSample3D/2,2,2", BlockRule::Mean, 2, 2, 2, 1, 1.7},
        {"downSample3D/4,4,2", BlockRule::Mean, 4, 4, 2, 1, 1.8},
        {"downSample3D/3,3,1", BlockRule::Mean, 3, 3, 1, 1, 0},
        {"downSample3DN/2,2,2x3", BlockRule::Mean, 2, 2, 2, 3, 2.5},
        {"maximum/2,2,2", BlockRule::Maximum, 2, 2, 2, 1, 2.5},
        {"maximum/2,2,2x3", BlockRule::Maximum, 2, 2, 2, 3, 2.5},
    };
    for (const Job& job : jobs) {
        const std::string name = std::string(job.what) + "/" + type;
        const std::string copy = copyBaseline((Sizes(job).n + Sizes(job).made) * static_cast<long>(sizeof(T)));
        add(name, [=](benchmark::State& state) {
            downSample<T>(state, job, copy, job.limit, [&](char* dst, T* src, const Sizes& s) {
                (job.rule == BlockRule::Mean ? KpRawData::downSample3DN : KpRawData::downSampleMaxFilterComponents3DN)(
                    dst, src, s.dx, s.dy, s.dz, job.fx, job.fy, job.fz, job.n, nullptr);
            });
        });
        for (const auto& path : blockPaths()) {
            if (path.usable)
                add(name + "/" + path.name, [=](benchmark::State& state) {
                    BlockLoop* const loop = path.run(KpTypedPointer(static_cast<T*>(nullptr)).type, job.rule);
                    downSample<T>(state, job, copy, 0,
                                  [&](char* dst, T* src, const Sizes& s) { runPath(loop, job, dst, src, s); });
                });
        }
    }
    const Job labels = {"labels", BlockRule::Maximum, 2, 2, 2, 1, 1.0};
    add("downSampleLabels3D/2,2,2/" + type,
        [labels, copy = copyBaseline(Sizes(labels).n * 2 * static_cast<long>(sizeof(T)))](benchmark::State& state) {
            const Sizes s(labels);
            const Memory src = noise<T>(s.n), dst = touched(s.made * static_cast<long>(sizeof(T)));
            auto* from = reinterpret_cast<T*>(src.get());
            auto* to = reinterpret_cast<T*>(dst.get());
            for (auto _ : state) {
                if constexpr (std::is_same_v<T, std::uint16_t>)
                    KpRawData::downSampleLabels3D(to, from, 512, 512, 256, 2, 2, 2, nullptr);
                else
                    KpRawData::downSampleLabels3D(from, to, 512, 512, 256, 2, 2, 2, nullptr);
                benchmark::ClobberMemory();
            }
            if (to[256 * 3 + 2] != from[512 * 6 + 4])
                state.SkipWithError("wrong label");
            report(state, static_cast<double>(s.n), static_cast<double>(s.n) * 2 * sizeof(T), copy, labels.limit);
        });
}

[[maybe_unused]] const bool isRegistered = [] {
    addJobs<std::uint8_t>("byte");
    addJobs<std::int16_t>("short");
    addJobs<std::uint16_t>("ushort");
    addJobs<float>("float");
    return true;
}();

}  // namespace
