#include "Reduce.h"

#include <kplib/rawdata/KpRawData.h>

#include <algorithm>
#include <vector>

namespace {

/// The middle of the slices from `first` on.
double middleHeight(const Volume& volume, long first, long count)
{
    double sum = 0;
    for (long z = first; z < first + count; ++z)
        sum += volume.height(z);
    return sum / static_cast<double>(count);
}

/// The volume with room for the voxels of the reduced one.
Volume shrunk(const Volume& volume, std::array<int, 3>& factors)
{
    Volume small = volume.withoutVoxels();
    for (int i = 0; i < 3; ++i) {
        const auto axis = static_cast<size_t>(i);
        factors[axis] = static_cast<int>(std::min<long>(factors[axis], volume.dims[axis]));
        small.dims[axis] = volume.dims[axis] / factors[axis];
        small.spacing[i] *= factors[axis];
    }
    const long slices = factors[2];
    const double first = middleHeight(volume, 0, slices);
    for (int i = 0; i < 2; ++i)  // to the middle of the first block
        small.origin +=
            volume.axes[static_cast<size_t>(i)] * ((factors[static_cast<size_t>(i)] - 1) / 2.0 * volume.spacing[i]);
    small.origin += volume.axes[2] * first;
    small.heights.clear();
    for (long z = 0; !volume.heights.empty() && z < small.dims[2]; ++z)
        small.heights.push_back(middleHeight(volume, z * slices, slices) - first);
    small.allocate();
    return small;
}

/// A block that holds padding has no mean: it becomes padding.
void keepPadding(Volume& volume, const std::array<int, 3>& factors, Volume& small)
{
    KpDArray<double> values;
    values.resize(volume.sliceCount());
    double padding = volume.padding.low;
    for (long z = 0; z < small.dims[2] * factors[2]; ++z) {
        KpRawData::memcpy({values.data(), KpPrimType::Double}, volume.slice(z), values.size());
        const KpTypedPointer slice = small.slice(z / factors[2]);
        for (long i = 0; i < values.size(); ++i) {
            const long x = i % volume.dims[0] / factors[0], y = i / volume.dims[0] / factors[1];
            if (!volume.padding.contains(values[i]) || x >= small.dims[0] || y >= small.dims[1])
                continue;
            void* const voxel = static_cast<unsigned char*>(slice.data) + (y * small.dims[0] + x) * small.type.size();
            KpRawData::memcpy({voxel, small.type}, {&padding, KpPrimType::Double}, 1);
        }
    }
}

}  // namespace

Volume reducedByMean(Volume& volume, std::array<int, 3> f, KpProgressInterface& progress)
{
    Volume small = shrunk(volume, f);
    const auto [x, y, z] = volume.dims;
    KpRawData::downSample3DN(small.bytes.data(), volume.voxels(), static_cast<unsigned long>(x),
                             static_cast<unsigned long>(y), static_cast<unsigned long>(z), f[0], f[1], f[2],
                             volume.components, &progress);
    if (volume.padding.isPresent())
        keepPadding(volume, f, small);
    return small;
}

Volume reducedByMaximum(Volume& volume, std::array<int, 3> f, KpProgressInterface& progress)
{
    Volume small = shrunk(volume, f);
    const auto [x, y, z] = volume.dims;
    KpRawData::downSampleMaxFilterComponents3DN(small.bytes.data(), volume.voxels(), static_cast<unsigned long>(x),
                                                static_cast<unsigned long>(y), static_cast<unsigned long>(z), f[0],
                                                f[1], f[2], volume.components, &progress);
    return small;
}
