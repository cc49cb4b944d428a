#include "Volumes.h"

#include <kplib/rawdata/TmSSETools.h>
#include <kplib/rawdata/detail/RowToolsKernels.h>

// The rows of slices of 512 x 512 floats, 64 of them, one call a row or a slice, against memcpy called as often on as
// many bytes.

using namespace kplib::bench;
using namespace kplib::detail;

namespace {

constexpr long width = 512, height = 512, slices = 64;
constexpr long rowBytes = width * 4, volumeBytes = rowBytes * height * slices;

/// `work(from, to)` on each of `count` pieces; `moved`: bytes read and written of each byte of a piece.
template <typename Work>
void addPieces(const std::string& name, long count, double moved, const std::string& baseline, double limit, Work work)
{
    add(name, [=](benchmark::State& state) {
        const Memory from = noise<float>(volumeBytes / 4), to = noise<float>(volumeBytes / 4);
        const long bytes = volumeBytes / count;
        for (auto _ : state) {
            for (long i = 0; i < count; ++i)
                work(from.get() + i * bytes, to.get() + i * bytes);
            benchmark::ClobberMemory();
        }
        report(state, volumeBytes / 4, moved * volumeBytes, baseline, limit);
    });
}

/// Each row of a table on 4 Ki floats, which stay in the first cache.
template <typename Function, typename Run>
void addRows(const std::string& name, std::span<const KernelPath<Function>> paths, Run run)
{
    for (const auto& path : paths) {
        if (path.usable)
            add(name + "/4Ki/" + path.name, [=](benchmark::State& state) {
                const Memory a = noise<float>(4096), b = noise<float>(4096);
                for (auto _ : state) {
                    run(path.run, a.get(), b.get());
                    benchmark::ClobberMemory();
                }
                report(state, 4096, 3 * 16384, name + "/4Ki/plain");
            });
    }
}

[[maybe_unused]] const bool isRegistered = [] {
    constexpr long rows = height * slices;
    addPieces("memcpy of rows", rows, 2, "", 0, [](char* from, char* to) { std::memcpy(to, from, rowBytes); });
    addPieces("memcpy of slices", slices, 2, "", 0,
              [](char* from, char* to) { std::memcpy(to, from, rowBytes * height); });
    addPieces("multiplyAndStoreUnaligned", rows, 2, "memcpy of rows", 1.1, [](char* from, char* to) {
        TmSSETools::multiplyAndStoreUnaligned(reinterpret_cast<float*>(from), 1.5f, width,
                                              reinterpret_cast<float*>(to));
    });
    addPieces("multiplyAndAddUnaligned", rows, 3, "memcpy of rows", 1.1, [](char* from, char* to) {
        TmSSETools::multiplyAndAddUnaligned(reinterpret_cast<float*>(from), 0.5f, width, reinterpret_cast<float*>(to));
    });
    addPieces("mirrorY", slices, 2, "memcpy of slices", 1.1,
              [](char*, char* to) { TmSSETools::mirrorY(to, height, rowBytes); });
    addPieces("memcpyMirrorY", slices, 2, "memcpy of slices", 1.1, [](char* from, char* to) {
        TmSSETools::memcpyMirrorY(reinterpret_cast<unsigned char*>(from), height, rowBytes,
                                  reinterpret_cast<unsigned char*>(to), rowBytes);
    });
    const auto scale = [](auto* run, char* a, char* b) {
        run(reinterpret_cast<float*>(a), 0.5f, 4096, reinterpret_cast<float*>(b));
    };
    addRows("multiplyAndStore", multiplyAndStorePaths(), scale);
    addRows("multiplyAndAdd", multiplyAndAddPaths(), scale);
    addRows("swapRows", swapRowsPaths(), [](auto* run, char* a, char* b) { run(a, b, 16384); });
    return true;
}();

}  // namespace
