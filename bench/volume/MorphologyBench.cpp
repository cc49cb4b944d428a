#include <support/Bench.h>

#include <kplib/volume/KpMorphology.h>
#include <kplib/volume/detail/MorphologyKernels.h>

#include <cstring>
#include <random>
#include <string>
#include <vector>

// Passes over masks of a CT's and a brain scan's size, against a copy of the bits. Rows of 512 voxels begin at words,
// those of 181 anywhere.

using namespace kplib::bench;
using namespace kplib::detail;

namespace {

const KpVec3i sizes[] = {{512, 512, 256}, {181, 217, 181}};

double bytes(const KpVec3i& dims)
{
    return static_cast<double>(dims[0]) * dims[1] * dims[2] / 8;
}

std::string nameOf(const KpVec3i& dims)
{
    return std::to_string(dims[0]) + 'x' + std::to_string(dims[1]) + 'x' + std::to_string(dims[2]);
}

KpBitfield noise(const KpVec3i& dims)
{
    KpBitfield field(static_cast<unsigned long>(dims[0]) * dims[1] * dims[2], KpBitfield::INIT_UNSET);
    std::mt19937 random(1);
    for (unsigned long i = 0; i < field.nWords(); ++i)
        field.data()[i] = random() & random() & random() & random() & random();
    return field;
}

void copyPacked(benchmark::State& state, const KpVec3i& dims)
{
    const KpBitfield src = noise(dims);
    KpBitfield dst(src);
    for (auto _ : state) {
        std::memcpy(dst.data(), src.data(), src.nBits() / 8);
        benchmark::ClobberMemory();
    }
    report(state, bytes(dims) * 8, bytes(dims));
}

using Operation = void(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims);

void operation(benchmark::State& state, const KpVec3i& dims, Operation* run, double limit)
{
    const KpBitfield src = noise(dims);
    KpBitfield dst(src);
    for (auto _ : state) {
        run(src, dst, dims);
        benchmark::ClobberMemory();
    }
    report(state, bytes(dims) * 8, bytes(dims), "packed/" + nameOf(dims), limit);
}

void path(benchmark::State& state, const KernelPath<MorphologyLoop>& path, const MorphologyReach reach)
{
    const KpVec3i dims = sizes[1];
    const KpBitfield src = noise(dims);
    KpBitfield dst(src);
    const MorphologyJob job{src.data(), dst.data(), dims[0], dims[1], dims[2], 1, reach, false};
    std::vector<char> area(morphologyAreaBytes(job));
    for (auto _ : state)
        path.run(job, area.data());
    report(state, bytes(dims) * 8, bytes(dims), "packed/" + nameOf(dims));
}

template <typename... Args>
void add(const std::string& name, Args... args)
{
    benchmark::RegisterBenchmark(name.c_str(), args...);
}

[[maybe_unused]] const bool isRegistered = [] {
    using M = KpMorphology;
    struct Case {
        const char* name;
        Operation* run;
        double limit, limitAligned;
    };
    static constexpr Case cases[] = {
        {"dilation6", [](auto& src, auto& dst, auto& dims) { M::dilation3D(src, dst, dims, 1, true); }, 5, 3},
        {"erosion6", [](auto& src, auto& dst, auto& dims) { M::erosion3D(src, dst, dims, 1, true); }, 5, 3},
        {"dilation18", [](auto& src, auto& dst, auto& dims) { M::dilation3D_18(src, dst, dims, 1, true); }, 5, 5},
        {"dilation26", [](auto& src, auto& dst, auto& dims) { M::dilation3D_26(src, dst, dims, 1, true); }, 5, 5},
        {"erosion26", [](auto& src, auto& dst, auto& dims) { M::erosion3D_26(src, dst, dims, 1, true); }, 5, 5},
        {"dilation26/5", [](auto& src, auto& dst, auto& dims) { M::dilation3D_26(src, dst, dims, 5, true); }, 10, 10},
        {"dilation6/5", [](auto& src, auto& dst, auto& dims) { M::dilation3D(src, dst, dims, 5, true); }, 0, 0},
    };
    for (const KpVec3i& dims : sizes) {
        add("packed/" + nameOf(dims), copyPacked, dims);
        for (const Case& c : cases)
            add(c.name + ('/' + nameOf(dims)), operation, dims, c.run, dims[0] % 32 == 0 ? c.limitAligned : c.limit);
    }
    for (const auto& one : morphologyPaths())
        for (int reach = 1; one.usable && reach <= 3; ++reach)
            add("pass/" + std::to_string(reach) + '/' + one.name, path, one, MorphologyReach{reach});
    return true;
}();

}  // namespace
