#include "Reduce.h"

#include <kplib/rawdata/KpRawData.h>

#include <algorithm>

namespace {

/// The volume with room for the voxels of the reduced one.
Volume shrunk(const Volume& volume, std::array<int, 3>& factors)
{
    Volume small;
    small.type = volume.type;
    small.axes = volume.axes;
    small.origin = volume.origin;
    small.isPlaced = volume.isPlaced;
    small.slope = volume.slope;
    small.intercept = volume.intercept;
    for (size_t i = 0; i < 3; ++i) {
        factors[i] = static_cast<int>(std::min<long>(factors[i], volume.dims[i]));
        small.dims[i] = volume.dims[i] / factors[i];
        small.spacing[i] = volume.spacing[i] * factors[i];
        for (size_t p = 0; p < 3; ++p)  // to the middle of the first block
            small.origin[p] += (factors[i] - 1) / 2.0 * volume.spacing[i] * volume.axes[i][p];
    }
    small.allocate();
    return small;
}

}  // namespace

Volume reducedByMean(Volume& volume, std::array<int, 3> f, KpProgressInterface& progress)
{
    Volume small = shrunk(volume, f);
    const auto [x, y, z] = volume.dims;
    KpRawData::downSample3D(small.bytes.data(), volume.voxels(), static_cast<unsigned long>(x),
                            static_cast<unsigned long>(y), static_cast<unsigned long>(z), f[0], f[1], f[2], &progress);
    return small;
}

Volume reducedByMaximum(Volume& volume, std::array<int, 3> f, KpProgressInterface& progress)
{
    Volume small = shrunk(volume, f);
    const auto [x, y, z] = volume.dims;
    KpRawData::downSampleMaxFilterComponents3DN(small.bytes.data(), volume.voxels(), static_cast<unsigned long>(x),
                                                static_cast<unsigned long>(y), static_cast<unsigned long>(z), f[0],
                                                f[1], f[2], 1, &progress);
    return small;
}
