#include <kplib/rawdata/KpRawData.h>

#include <kplib/cpu/Loose.h>
#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/detail/DownSampleKernels.h>
#include <kplib/threads/KpProgressInterface.h>
#include <kplib/threads/ProgressScope.h>

#include <cstdint>
#include <span>

namespace {

using namespace kplib::detail;

// Sizes and factors of a call.
struct Grid {
    unsigned long size[3];
    int factor[3];

    bool hasFactors() const { return factor[0] >= 1 && factor[1] >= 1 && factor[2] >= 1; }
    // Whether no factor exceeds its size by more than one, which is an axis without blocks.
    bool isWithin() const { return within(0) && within(1) && within(2); }
    // Null is accepted if nothing is read and written; the progress is reported all the same.
    bool accepts(const void* dst, const void* src) const
    {
        return (dst && src) || !(blocks(0) && blocks(1) && blocks(2));
    }
    long blocks(int axis) const { return static_cast<long>(size[axis] / static_cast<unsigned long>(factor[axis])); }
    long voxels(int axis) const { return static_cast<long>(size[axis]); }

private:
    bool within(int axis) const { return static_cast<unsigned long>(factor[axis]) - 1 <= size[axis]; }
};

bool isSupported(KpPrimType type)
{
    if (type.isNumber())
        return true;
    getTheLogInstance().errorf("Unsupported data type %s in KpRawData::downSample3D\n", type.name());
    return false;
}

// Has `makeLayer(k)` make each layer of voxels and reports step `reached(k)` after it. A canceled progress still gets
// its first layer.
template <typename MakeLayer, typename Reached>
void eachLayer(const Grid& grid, KpProgressInterface* progress, MakeLayer makeLayer, Reached reached)
{
    const ProgressScope scope(progress);
    if (progress)
        progress->startWorking(static_cast<int>(grid.size[2]), {});
    for (long k = 0; k < grid.blocks(2); ++k) {
        makeLayer(k);
        if (!progress)
            continue;
        if (progress->isCanceled())
            break;
        progress->setProgressValue(static_cast<int>(reached(k)));
    }
}

void downSample(BlockRule rule, void* dst, KpTypedPointer src, const Grid& grid, int components,
                KpProgressInterface* progress)
{
    static BlockLoops* const loops = best(blockPaths());
    if (!isSupported(src.type) || !grid.hasFactors() || !grid.isWithin() || components < 1)
        return;
    if (!grid.accepts(dst, src.data))
        return;
    BlockLoop* const loop = loops(src.type, rule);
    const long size = src.type.size(), voxel = components * size;
    BlockRow row{};
    row.blocks = grid.blocks(0);
    row.fx = grid.factor[0];
    row.fy = grid.factor[1];
    row.fz = grid.factor[2];
    row.components = components;
    row.rowStride = grid.voxels(0) * components;
    row.sliceStride = grid.voxels(1) * row.rowStride;
    char* to = static_cast<char*>(dst);
    const auto makeLayer = [&](long k) {
        for (long j = 0; j < grid.blocks(1); ++j, to += row.blocks * voxel) {
            row.src =
                static_cast<const char*>(src.data) + (k * row.fz * row.sliceStride + j * row.fy * row.rowStride) * size;
            row.dst = to;
            loop(row);
        }
    };
    // Intentional: progress is the first source slice of the layer plus 1, so it ends below dz.
    eachLayer(grid, progress, makeLayer, [&](long k) { return k * row.fz + 1; });
}

// FX is the factor, or 0 if it is known at run time only.
template <int FX, typename Word>
void takeEvery(Loose<Word>* __restrict to, const Loose<Word>* __restrict from, long n, long factor)
{
    for (long i = 0; i < n; ++i)
        to[i].value = from[i * (FX ? FX : factor)].value;
}

template <typename Word>
void takeCorners(void* dst, const void* src, const Grid& grid, KpProgressInterface* progress)
{
    auto* to = static_cast<Loose<Word>*>(dst);
    auto* from = static_cast<const Loose<Word>*>(src);
    const long nx = grid.blocks(0), ny = grid.blocks(1), fx = grid.factor[0];
    const auto makeLayer = [&](long k) {
        for (long j = 0; j < ny; ++j, to += nx) {
            const auto* row = from + (k * grid.factor[2] * grid.voxels(1) + j * grid.factor[1]) * grid.voxels(0);
            fx == 2 ? takeEvery<2>(to, row, nx, fx) : takeEvery<0>(to, row, nx, fx);
        }
    };
    // Intentional: progress counts target layers against source slices: it ends at about dz / fz.
    eachLayer(grid, progress, makeLayer, [](long k) { return k + 1; });
}

}  // namespace

void KpRawData::downSample3D(void* dst, KpTypedPointer src, unsigned long dx, unsigned long dy, unsigned long dz,
                             int fx, int fy, int fz, KpProgressInterface* progress)
{
    downSample(BlockRule::Mean, dst, src, {{dx, dy, dz}, {fx, fy, fz}}, 1, progress);
}

void KpRawData::downSample3DN(void* dst, KpTypedPointer src, unsigned long dx, unsigned long dy, unsigned long dz,
                              int fx, int fy, int fz, int nDataVar, KpProgressInterface* progress)
{
    downSample(BlockRule::Mean, dst, src, {{dx, dy, dz}, {fx, fy, fz}}, nDataVar, progress);
}

void KpRawData::downSampleMaxFilterComponents3DN(void* dst, KpTypedPointer src, unsigned long dx, unsigned long dy,
                                                 unsigned long dz, int fx, int fy, int fz, int nDataVar,
                                                 KpProgressInterface* progress)
{
    downSample(BlockRule::Maximum, dst, src, {{dx, dy, dz}, {fx, fy, fz}}, nDataVar, progress);
}

void KpRawData::downSampleLabels3D(void* a, KpTypedPointer b, unsigned long dx, unsigned long dy, unsigned long dz,
                                   int fx, int fy, int fz, KpProgressInterface* progress)
{
    const Grid grid{{dx, dy, dz}, {fx, fy, fz}};
    if (!isSupported(b.type) || !grid.hasFactors() || !grid.accepts(a, b.data))
        return;
    // Intentional: only ushort is copied from `b` to `a`; callers order source and target by this.
    const bool toA = b.type == KpPrimType::UShort;
    void* const dst = toA ? a : b.data;
    const void* const src = toA ? b.data : a;
    switch (b.type.size()) {
    case 1:
        return takeCorners<std::uint8_t>(dst, src, grid, progress);
    case 2:
        return takeCorners<std::uint16_t>(dst, src, grid, progress);
    case 4:
        return takeCorners<std::uint32_t>(dst, src, grid, progress);
    default:
        return takeCorners<std::uint64_t>(dst, src, grid, progress);
    }
}
