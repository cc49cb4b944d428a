#include "Sampler.h"

KpBox3f coveredBox(const Volume& volume)
{
    constexpr float rounding = 1e-3F;  // of a voxel: middles at the very edge are inside
    const auto end = [&](size_t axis) { return static_cast<float>(volume.dims[axis]) - 0.5F + rounding; };
    const long last = volume.dims[2] - 1;
    const auto level = [&](double height) { return static_cast<float>(height / volume.spacing[2]); };
    return {-0.5F - rounding,
            end(0),
            -0.5F - rounding,
            end(1),
            level(volume.height(0) - volume.sliceExtent(0) / 2) - rounding,
            level(volume.height(last) + volume.sliceExtent(last) / 2) + rounding};
}
