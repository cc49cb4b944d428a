#include "Volumes.h"

#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/TransposeKernels.h>

// Permuting the axes in place against a copy of the block.

using namespace kplib::bench;
using namespace kplib::detail;

namespace {

void swapDims(benchmark::State& state, KpPrimType type, std::array<int, 3> size, std::array<int, 3> perm, double limit)
{
    const long bytes = static_cast<long>(size[0]) * size[1] * size[2] * type.size();
    const Memory memory = touched(bytes);
    memory.get()[bytes - 1] = 2;  // not constant
    for (auto _ : state) {
        std::array<int, 3> dims = size;
        if (!KpRawData::swapDims({memory.get(), type}, dims.data(), perm.data(), 1))
            state.SkipWithError("failed");
        benchmark::ClobberMemory();
    }
    report(state, static_cast<double>(bytes) / type.size(), 2.0 * static_cast<double>(bytes), copyOf(2 * bytes), limit);
}

void addTransposes(int size)
{
    const std::string name = "transpose/" + std::to_string(size) + " bytes/";
    for (const auto& path : transposePaths(size)) {
        add(name + path.name, [=](benchmark::State& state) {
            const Memory from = touched(512 * 512 * size), to = touched(512 * 512 * size);
            for (auto _ : state) {
                path.run(from.get(), to.get(), 512, 512);
                benchmark::ClobberMemory();
            }
            report(state, 512 * 512, 2.0 * 512 * 512 * size, name + "plain");
        });
    }
}

[[maybe_unused]] const bool isRegistered = [] {
    for (const std::array<int, 3>& size : {std::array{512, 512, 256}, std::array{181, 217, 181}}) {
        const long voxels = static_cast<long>(size[0]) * size[1] * size[2];
        const std::string block = "swapDims/" + std::to_string(size[0]) + "/";
        for (const KpPrimType type : {KpPrimType::Byte, KpPrimType::UShort, KpPrimType::Float}) {
            copyBaseline(2 * voxels * type.size());
            const std::string name = block + type.name() + "/";
            add(name + "2,1,0", swapDims, type, size, std::array{2, 1, 0}, type == KpPrimType::UShort ? 5.0 : 0.0);
            add(name + "0,2,1", swapDims, type, size, std::array{0, 2, 1}, 0.0);
            add(name + "1,0,2", swapDims, type, size, std::array{1, 0, 2}, 0.0);
        }
    }
    for (int size : {1, 2, 4, 8})
        addTransposes(size);
    return true;
}();

}  // namespace
