#include "Volumes.h"

#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

// Mirroring in place against a copy of the block.

using namespace kplib::bench;
using namespace kplib::detail;

namespace {

void flip(benchmark::State& state, int voxel, int axis)
{
    const int dims[] = {512, 512, 256};
    const long bytes = 512L * 512 * 256 * voxel;
    const Memory memory = touched(bytes);
    memory.get()[0] = 2;
    const long steps[] = {1, 512, 512L * 512};
    KpRawData::flip(memory.get(), voxel, dims, axis);
    if (memory.get()[steps[axis] * (dims[axis] - 1) * voxel] != 2)
        state.SkipWithError("wrong place");
    for (auto _ : state) {
        KpRawData::flip(memory.get(), voxel, dims, axis);
        benchmark::ClobberMemory();
    }
    report(state, static_cast<double>(bytes / voxel), 2.0 * static_cast<double>(bytes), copyOf(2 * bytes), 1.2);
}

void addReversals(int width)
{
    const std::string name = "copy reversed/" + std::to_string(width) + "/512/";
    for (const auto& path : reversePaths()) {
        if (path.usable)
            add(name + path.name, [=](benchmark::State& state) {
                const Memory from = touched(512 * width), to = touched(512 * width);
                for (auto _ : state) {
                    path.run(width)(to.get(), from.get(), 512);
                    benchmark::ClobberMemory();
                }
                report(state, 512, 1024.0 * width, name + "plain");
            });
    }
}

[[maybe_unused]] const bool isRegistered = [] {
    for (int voxel : {1, 2, 3, 4}) {
        copyBaseline(2 * 512L * 512 * 256 * voxel);
        for (int axis = 0; axis < 3; ++axis)
            add("flip/" + std::to_string(voxel) + " bytes/" + "xyz"[axis], flip, voxel, axis);
    }
    for (int width : {1, 2, 3, 4, 8})
        addReversals(width);
    return true;
}();

}  // namespace
