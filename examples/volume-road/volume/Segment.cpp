#include "Segment.h"

#include <kplib/geometry/KpBox2f.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/threads/ProgressScope.h>
#include <kplib/volume/KpConnectedComponents.h>
#include <kplib/volume/KpMorphology.h>

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <cstdint>
#include <vector>

namespace {

/// Calls `visit(value, isPadding)` with the displayed value of each voxel in order, a slice in memory at a time.
/// One step of the progress a slice.
template <typename Visit>
void forEachValue(Volume& volume, KpProgressInterface& progress, Visit visit)
{
    KpDArray<double> values;
    values.resize(volume.sliceCount());
    for (long z = 0; z < volume.dims[2]; ++z) {
        KpRawData::memcpy({values.data(), KpPrimType::Double}, volume.slice(z), values.size());
        for (const double stored : values)
            visit(stored * volume.slope + volume.intercept, volume.padding.contains(stored) || std::isnan(stored));
        progress.nextStep();
    }
}

constexpr int levels = 256;
using Histogram = std::array<double, levels>;

/// The first level of the brighter of two classes whose means differ most.
int brighterClass(const Histogram& counts)
{
    double total = 0, sum = 0;
    for (int i = 0; i < levels; ++i) {
        total += counts[static_cast<size_t>(i)];
        sum += i * counts[static_cast<size_t>(i)];
    }
    double below = 0, sumBelow = 0, best = -1;
    int threshold = 0;
    for (int i = 0; i + 1 < levels; ++i) {
        below += counts[static_cast<size_t>(i)];
        sumBelow += i * counts[static_cast<size_t>(i)];
        if (below == 0 || below == total)
            continue;
        const double apart = sumBelow / below - (sum - sumBelow) / (total - below);
        const double variance = below * (total - below) * apart * apart;
        if (variance > best) {
            best = variance;
            threshold = i + 1;
        }
    }
    return threshold;
}

/// Otsu's threshold on a scale of 256 levels.
double otsu(Volume& volume, KpProgressInterface& progress)
{
    const auto [low, high] = displayedRange(volume);
    const double step = std::max(high - low, 1e-6) / levels;
    Histogram counts{};
    forEachValue(volume, progress, [&, low = low](double value, bool isPadding) {
        if (!isPadding)
            ++counts[static_cast<size_t>(std::clamp(static_cast<int>((value - low) / step), 0, levels - 1))];
    });
    return low + brighterClass(counts) * step;
}

KpBitfield maskAbove(Volume& volume, double threshold, KpProgressInterface& progress)
{
    KpBitfield mask;
    mask.resize(static_cast<unsigned long>(volume.count()), KpBitfield::INIT_UNSET);
    unsigned long i = 0;
    forEachValue(volume, progress, [&](double value, bool isPadding) {
        if (!isPadding && value >= threshold)
            mask.set(i);
        ++i;
    });
    return mask;
}

/// Calls `visit` with the number of each set bit.
template <typename Visit>
void forEachSetBit(const KpBitfield& mask, Visit visit)
{
    for (unsigned long word = 0; word * 32 < mask.nBits(); ++word) {
        for (std::uint32_t bits = mask.data()[word]; bits != 0; bits &= bits - 1) {
            const unsigned long bit = word * 32 + static_cast<unsigned long>(std::countr_zero(bits));
            if (bit < mask.nBits())
                visit(bit);
        }
    }
}

/// The slices, rows and columns around the set voxels of a mask.
struct Crop {
    std::array<long, 3> low, dims{};

    Crop(const KpBitfield& mask, const std::array<long, 3>& size) : low(size)
    {
        std::array<long, 3> high{-1, -1, -1};
        forEachSetBit(mask, [&](unsigned long bit) {
            const auto i = static_cast<long>(bit);
            const std::array<long, 3> at{i % size[0], i / size[0] % size[1], i / size[0] / size[1]};
            for (size_t axis = 0; axis < 3; ++axis) {
                low[axis] = std::min(low[axis], at[axis]);
                high[axis] = std::max(high[axis], at[axis]);
            }
        });
        for (size_t axis = 0; axis < 3; ++axis)
            dims[axis] = std::max(high[axis] - low[axis] + 1, 0L);
    }

    long count() const { return dims[0] * dims[1] * dims[2]; }

    /// Calls `visit(i, bit)` for each voxel within, with its number there and in the mask.
    template <typename Visit>
    void forEach(const std::array<long, 3>& size, Visit visit) const
    {
        long i = 0;
        for (long z = 0; z < dims[2]; ++z) {
            for (long y = 0; y < dims[1]; ++y) {
                const long row = ((z + low[2]) * size[1] + y + low[1]) * size[0] + low[0];
                for (long x = 0; x < dims[0]; ++x, ++i)
                    visit(i, static_cast<unsigned long>(row + x));
            }
        }
    }
};

/// Labels the mask's regions and keeps the largest of them; false if there are too many to number. Two bytes a voxel of
/// the box around the mask are the most memory that segmentation takes.
bool keepLargest(KpBitfield& mask, const std::array<long, 3>& size, Region& region)
{
    const Crop crop(mask, size);
    if (crop.count() == 0)
        return true;
    KpDArray<unsigned short> labels;  // the labels replace the image of the mask in the same memory
    labels.resize(crop.count());
    crop.forEach(size, [&](long i, unsigned long bit) { labels[i] = mask.test(bit); });
    unsigned short* image = labels.data();
    const int dims[] = {static_cast<int>(crop.dims[0]), static_cast<int>(crop.dims[1]), static_cast<int>(crop.dims[2])};
    KpDArray<KpConnectedComponents::Component> components;
    region.components =
        KpConnectedComponents::labelCC({image, KpPrimType::UShort}, dims, 26, image, 0, 1, 1, 0, 0, &components);
    if (region.components < 0)
        return false;
    long largest = 0;
    for (long i = 1; i < components.size(); ++i) {
        if (components[i].nVoxels > components[largest].nVoxels)
            largest = i;
    }
    mask.unsetAll();
    crop.forEach(size, [&](long i, unsigned long bit) {
        if (largest > 0 && labels[i] == largest)
            mask.set(bit);
    });
    return true;
}

/// The voxels of one slice of a mask: number and sums of x and y, and their box.
struct SliceSum {
    double voxels = 0, x = 0, y = 0;
    KpBox2f box;
};

std::vector<SliceSum> sumSlices(const KpBitfield& mask, const Volume& volume)
{
    std::vector<SliceSum> slices(static_cast<size_t>(volume.dims[2]));
    const auto width = static_cast<unsigned long>(volume.dims[0]), height = static_cast<unsigned long>(volume.dims[1]);
    forEachSetBit(mask, [&](unsigned long bit) {
        const unsigned long row = bit / width;
        SliceSum& slice = slices[row / height];
        const auto x = static_cast<double>(bit % width), y = static_cast<double>(row % height);
        ++slice.voxels;
        slice.x += x;
        slice.y += y;
        slice.box.extendBy(KpVec2f(static_cast<float>(x), static_cast<float>(y)));
    });
    return slices;
}

/// Adds what the box of a slice covers, half a voxel and half the gaps around its middles.
void extendBox(KpBox3f& box, const SliceSum& slice, long z, const Volume& volume, const KpMat4f& toPatient)
{
    for (int corner = 0; corner < 8; ++corner) {
        const float x = corner & 1 ? slice.box.xmax() + 0.5F : slice.box.xmin() - 0.5F;
        const float y = corner & 2 ? slice.box.ymax() + 0.5F : slice.box.ymin() - 0.5F;
        const double height = volume.height(z) + (corner & 4 ? 0.5 : -0.5) * volume.sliceExtent(z);
        box.extendBy(toPatient.multVecMatrix(KpVec3f(x, y, static_cast<float>(height / volume.spacing[2]))));
    }
}

/// Size, centre and box of the region, in the patient's space: slice by slice, since a tilt shifts them and gaps
/// differ.
void measure(const KpBitfield& mask, const Volume& volume, const Space& space, Region& region)
{
    region.voxels = mask.nSetBits();
    if (region.voxels == 0)
        return;
    const KpMat4f toPatient = space.voxels->asTransformation();
    const std::vector<SliceSum> slices = sumSlices(mask, volume);
    KpVec3d sum(0, 0, 0);
    double cubic = 0;
    for (long z = 0; z < volume.dims[2]; ++z) {
        const SliceSum& slice = slices[static_cast<size_t>(z)];
        if (slice.voxels == 0)
            continue;
        const double share = volume.voxelVolume(z);
        sum += KpVec3d(slice.x, slice.y, slice.voxels * volume.height(z) / volume.spacing[2]) * share;
        cubic += slice.voxels * share;
        extendBox(region.box, slice, z, volume, toPatient);
    }
    region.millilitres = cubic / 1000;
    region.center = toPatient.multVecMatrix(KpVec3f(sum / cubic));
}

}  // namespace

KpResult segment(Volume& volume, const Space& space, std::optional<double> threshold, KpProgressInterface& progress,
                 Region& region)
{
    if (volume.components == 3) {
        Volume grey = luminanceOf(volume);
        return segment(grey, space, threshold, progress, region);
    }
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(2 * volume.dims[2] + 3), "");
    region.isThresholdGiven = threshold.has_value();
    region.threshold = threshold ? *threshold : otsu(volume, progress);
    KpBitfield mask = maskAbove(volume, region.threshold, progress), eroded;

    const KpVec3i size(static_cast<int>(volume.dims[0]), static_cast<int>(volume.dims[1]),
                       static_cast<int>(volume.dims[2]));
    KpMorphology::erosion3D(mask, eroded, size, 1, true);
    KpMorphology::dilation3D(eroded, mask, size, 1, true);
    progress.nextStep();

    if (!keepLargest(mask, volume.dims, region))
        return badInput("there are too many regions at or above %.6g; choose another value with --threshold",
                        region.threshold);
    progress.nextStep();

    measure(mask, volume, space, region);
    KpMorphology::erosion3D(mask, eroded, size, 1, true);
    region.mask = mask;
    region.outline.swap(mask);
    region.outline ^= eroded;
    progress.nextStep();
    return KpResult();
}
