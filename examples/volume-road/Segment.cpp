#include "Segment.h"

#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpVec3d.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/threads/ProgressScope.h>
#include <kplib/volume/KpConnectedComponents.h>
#include <kplib/volume/KpMorphology.h>

#include <algorithm>
#include <bit>
#include <cmath>

namespace {

using Bytes = KpDArray<unsigned char>;

/// The displayed values of all voxels.
KpDArray<float> displayedValues(Volume& volume)
{
    KpDArray<float> values;
    values.resize(volume.count());
    const double slope = volume.slope == 0 ? 1 : volume.slope;
    KpRawData::mapLinear({values.data(), KpPrimType::Float}, volume.voxels(),
                         static_cast<unsigned long>(volume.count()), volume.intercept / slope, slope);
    return values;
}

/// The value from which on others belong to the brighter of two classes whose means differ most, on a scale of 256
/// levels.
double otsu(KpDArray<float>& values)
{
    constexpr int levels = 256;
    const KpTypedPointer floats{values.data(), KpPrimType::Float};
    const auto size = static_cast<unsigned long>(values.size());
    float low = 0, high = 0;
    KpRawData::getRange(floats, size, low, high);
    const double step = std::max(static_cast<double>(high) - static_cast<double>(low), 1e-6) / levels;
    Bytes level;
    level.resize(values.size());
    KpRawData::mapLinear({level.data(), KpPrimType::Byte}, floats, size, -static_cast<double>(low), 1 / step);
    double counts[levels] = {};
    for (const unsigned char i : level)
        ++counts[i];
    double total = 0, sum = 0;
    for (int i = 0; i < levels; ++i) {
        total += counts[i];
        sum += i * counts[i];
    }
    double below = 0, sumBelow = 0, best = -1;
    int threshold = 0;
    for (int i = 0; i + 1 < levels; ++i) {
        below += counts[i];
        sumBelow += i * counts[i];
        if (below == 0 || below == total)
            continue;
        const double apart = sumBelow / below - (sum - sumBelow) / (total - below);
        const double variance = below * (total - below) * apart * apart;
        if (variance > best) {
            best = variance;
            threshold = i + 1;
        }
    }
    return static_cast<double>(low) + threshold * step;
}

/// Labels the mask's regions and keeps the largest of them; false if there are too many to number.
bool keepLargest(KpBitfield& mask, const int* dims, Bytes& bytes, Region& region)
{
    const auto count = static_cast<unsigned long>(bytes.size());
    mask.toLabels(count, bytes.data(), 1, KpBitfield::INSERT_REPLACE);
    KpDArray<unsigned short> labels;
    labels.resize(bytes.size());
    unsigned short* image = labels.data();
    KpDArray<KpConnectedComponents::Component> components;
    region.components =
        KpConnectedComponents::labelCC({bytes.data(), KpPrimType::Byte}, dims, 26, image, 0, 1, 1, 0, 0, &components);
    if (region.components < 0)
        return false;
    long largest = 0;
    for (long i = 1; i < components.size(); ++i) {
        if (components[i].nVoxels > components[largest].nVoxels)
            largest = i;
    }
    for (long i = 0; i < bytes.size(); ++i)
        bytes[i] = largest > 0 && labels[i] == largest;
    mask.fromLabels(count, bytes.data(), 1);
    return true;
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

/// Size, centre and box of the region, in the patient's space.
void measure(const KpBitfield& mask, const Volume& volume, const Space& space, Region& region)
{
    KpVec3d sum(0, 0, 0);
    KpBox3f box;
    const auto width = static_cast<unsigned long>(volume.dims[0]), height = static_cast<unsigned long>(volume.dims[1]);
    forEachSetBit(mask, [&](unsigned long bit) {
        const unsigned long row = bit / width, slice = row / height;
        const KpVec3f at(static_cast<float>(bit % width), static_cast<float>(row % height), static_cast<float>(slice));
        sum += KpVec3d(at);
        box.extendBy(at);
    });
    region.voxels = mask.nSetBits();
    if (region.voxels == 0)
        return;
    const auto& [dx, dy, dz] = volume.spacing;
    region.millilitres = static_cast<double>(region.voxels) * dx * dy * dz / 1000;
    const KpMat4f toPatient = space.voxels->asTransformation();
    region.center = toPatient.multVecMatrix(KpVec3f(sum / static_cast<double>(region.voxels)));
    const KpVec3f half(0.5F, 0.5F, 0.5F);
    const KpBox3f covered(box.min() - half, box.max() + half);
    for (int corner = 0; corner < 8; ++corner)
        region.box.extendBy(toPatient.multVecMatrix(covered.corner(corner)));
}

}  // namespace

KpResult segment(Volume& volume, const Space& space, std::optional<double> threshold, KpProgressInterface& progress,
                 Region& region)
{
    const ProgressScope scope(&progress);
    progress.startWorking(4, "");
    KpDArray<float> values = displayedValues(volume);
    region.isThresholdGiven = threshold.has_value();
    region.threshold = threshold ? *threshold : otsu(values);
    Bytes isAbove;
    isAbove.resize(values.size());
    std::transform(values.begin(), values.end(), isAbove.begin(),
                   [&](float value) { return static_cast<double>(value) >= region.threshold; });
    progress.nextStep();

    const int dims[] = {static_cast<int>(volume.dims[0]), static_cast<int>(volume.dims[1]),
                        static_cast<int>(volume.dims[2])};
    const KpVec3i size(dims[0], dims[1], dims[2]);
    KpBitfield mask, eroded;
    mask.fromLabels(static_cast<unsigned long>(isAbove.size()), isAbove.data(), 1);
    KpMorphology::erosion3D(mask, eroded, size, 1, true);
    KpMorphology::dilation3D(eroded, mask, size, 1, true);
    progress.nextStep();

    if (!keepLargest(mask, dims, isAbove, region))
        return badInput("there are too many regions at or above %.6g; choose another value with --threshold",
                        region.threshold);
    progress.nextStep();

    measure(mask, volume, space, region);
    KpMorphology::erosion3D(mask, eroded, size, 1, true);
    region.outline = mask;
    region.outline ^= eroded;
    progress.nextStep();
    return KpResult();
}
