#include "PlainConvert.h"
#include "Volumes.h"

#include <kplib/foundation/KpHandle.h>
#include <kplib/net/TmMsg.h>
#include <kplib/rawdata/KpRawData2D.h>
#include <kplib/rawdata/KpRawData3D.h>
#include <kplib/rawdata/TmDataAccess.h>
#include <kplib/system/KpMD5Coder.h>

#include <vector>

// Volumes: through a message against copies of the bytes, digests against that of one block, lines against the loop
// that a user would write; slices of a block against a copy.

using namespace kplib::bench;

namespace {

constexpr long messageBytes = 64L << 20;
const KpVec3l lineDims(512L, 512L, 64L);
constexpr long lineVoxels = 512L * 512 * 64;

/// 64 MiB of shorts over `memory`: one block, or with `gap` bytes after each row.
TmDataAccess volume(const Memory& memory, long gap)
{
    return {{512L, 512L, 128L}, {2L, 1024 + gap, 0L}, memory.get(), KpPrimType::Short, 1, KpAllocator::AllocatorNone};
}

void writeMessage(benchmark::State& state, long gap, const std::string& baseline, double limit)
{
    const Memory memory = touched(messageBytes + 512 * 128 * gap);
    const TmDataAccess source = volume(memory, gap);
    const TmDataAccess* const sent = &source;
    TmMsg msg;
    msg << sent;
    for (auto _ : state) {
        msg.reset(0);
        msg << sent;
        benchmark::ClobberMemory();
    }
    if (msg.size() != messageBytes + 33)
        state.SkipWithError("wrong size");
    report(state, messageBytes / 2.0, 2.0 * messageBytes, baseline, limit);
}

void readMessage(benchmark::State& state, const std::string& baseline)
{
    const Memory memory = touched(messageBytes);
    const TmDataAccess source = volume(memory, 0);
    const TmDataAccess* const sent = &source;
    TmMsg msg;
    msg << sent;
    for (auto _ : state) {
        TmMsg reader(msg.size(), msg.dataPtr());
        TmDataAccess* read = nullptr;
        reader >> read;
        const KpHandle<TmDataAccess> handle(read);
        if (!read || !read->hasData())
            return state.SkipWithError("nothing read");
    }
    report(state, messageBytes / 2.0, 2.0 * messageBytes, baseline, 1.2);
}

void copyToFreshMemory(benchmark::State& state)
{
    const Memory memory = touched(messageBytes);
    for (auto _ : state) {
        const Memory fresh(static_cast<char*>(std::malloc(messageBytes)));
        std::memcpy(fresh.get(), memory.get(), messageBytes);
        benchmark::DoNotOptimize(fresh.get());
        benchmark::ClobberMemory();
    }
    report(state, messageBytes / 2.0, 2.0 * messageBytes);
}

/// Calls `line(x, y, z, i)` for each line along `axis`, i counted from 0.
template <typename Line>
void eachLine(int axis, Line line)
{
    long i = 0;
    for (long b = 0; b < (axis == 2 ? 512 : 64); ++b)
        for (long a = 0; a < 512; ++a)
            axis == 2 ? line(a, b, -1L, i++) : line(-1L, a, b, i++);
}

using LineWork = void(const TmDataAccess& volume, int axis, float* line);

void lines(benchmark::State& state, LineWork* work, int axis, const std::string& baseline, double limit)
{
    const Memory memory = noise<std::int16_t>(lineVoxels);
    const TmDataAccess source(lineDims, {}, static_cast<void*>(memory.get()), KpPrimType::Short, 1,
                              KpAllocator::AllocatorNone);
    std::vector<float> line(512, 3.25F);
    for (auto _ : state) {
        work(source, axis, line.data());
        benchmark::ClobberMemory();
    }
    report(state, lineVoxels, 6.0 * lineVoxels, baseline, limit);
}

void rows(const TmDataAccess& volume, int axis, float* line)
{
    eachLine(axis, [&](long x, long y, long z, long) { volume.row(x, y, z, line); });
}

void putRows(const TmDataAccess& volume, int axis, float* line)
{
    eachLine(axis, [&](long x, long y, long z, long) { volume.putRow(x, y, z, line); });
}

void plainRows(const TmDataAccess& volume, int axis, float* line)
{
    const auto* const voxels = static_cast<const std::int16_t*>(volume.dataPtr(0));
    eachLine(axis, [&](long, long, long, long i) {
        if (axis == 0)
            return plainConvert(line, voxels + 512 * i, 512);
        for (long z = 0; z < volume.dims()[2]; ++z)
            line[z] = voxels[i + z * 512 * 512];
    });
}

void plainPutRows(const TmDataAccess& volume, int axis, float* line)
{
    auto* const voxels = static_cast<std::int16_t*>(volume.dataPtr(0));
    eachLine(axis, [&](long, long, long, long i) {
        if (axis == 0)
            return plainConvert(voxels + 512 * i, line, 512);
        for (long z = 0; z < volume.dims()[2]; ++z)
            voxels[i + z * 512 * 512] = static_cast<std::int16_t>(std::clamp(line[z], -32768.0F, 32767.0F));
    });
}

void slices(benchmark::State& state, int orientation)
{
    const Memory memory = touched(2 * lineVoxels), to = touched(2L * 512 * 512);
    const KpRawData3D block(512, 512, 64, 2, memory.get());
    KpRawData2D slice(512, 512, 2, to.get());
    int dims[3];
    block.getDims(dims, orientation);
    for (auto _ : state) {
        for (int k = 0; k < dims[2]; ++k)
            block.getSlice(orientation, k, slice, 1);
        benchmark::ClobberMemory();
    }
    report(state, lineVoxels, 4.0 * lineVoxels, copyOf(4 * lineVoxels));
}

template <typename Digest>
void digest(benchmark::State& state, long gap, const std::string& baseline, Digest digestOf)
{
    const Memory memory = touched(messageBytes + 512 * 128 * gap);
    const TmDataAccess source = volume(memory, gap);
    for (auto _ : state)
        benchmark::DoNotOptimize(digestOf(source));
    report(state, messageBytes / 2.0, messageBytes, baseline, baseline.empty() ? 0 : 1.05);
}

void addDigests()
{
    const std::string block = "MD5 of a block/64 MiB";
    const auto hash = [](const TmDataAccess& source) { return source.hash(); };
    add(block, [](benchmark::State& state) {
        digest(state, 0, "", [](const TmDataAccess& source) {
            return KpLib::MD5Coder().append(source.dataPtr(0), messageBytes).md5();
        });
    });
    for (const long gap : {0L, 64L})
        add(gap ? "hash/64 MiB with gaps" : "hash/64 MiB",
            [=](benchmark::State& state) { digest(state, gap, block, hash); });
}

[[maybe_unused]] const bool isRegistered = [] {
    const std::string copy = copyBaseline(2 * messageBytes), fresh = "malloc, memcpy, free/64 MiB";
    add("write to a message/64 MiB", writeMessage, 0L, copy, 1.2);
    add("write to a message/64 MiB with gaps", writeMessage, 64L, copy, 0.0);
    add(fresh, copyToFreshMemory);
    add("read from a message/64 MiB", readMessage, fresh);
    addDigests();
    for (const int axis : {0, 2}) {
        const std::string name = std::string("short/") + "xyz"[axis];
        add("plain row/" + name, lines, plainRows, axis, "", 0.0);
        add("row/" + name, lines, rows, axis, "plain row/" + name, axis == 0 ? 1.3 : 0.0);
        add("plain putRow/" + name, lines, plainPutRows, axis, "", 0.0);
        add("putRow/" + name, lines, putRows, axis, "plain putRow/" + name, 0.0);
    }
    copyBaseline(4 * lineVoxels);
    for (const int orientation : {0, 1, 2})
        add("getSlice/" + std::to_string(orientation), slices, orientation);
    return true;
}();

}  // namespace
