#include <kplib/volume/detail/MorphologyKernels.h>

#include <algorithm>
#include <cstdlib>

namespace kplib::detail {
namespace {

// Whether voxel (x, y, z) or a neighbour inside the volume has the value.
bool isAround(const KpBitfield& field, const KpVec3i& dims, int x, int y, int z, int reach, bool value)
{
    for (int dz = -std::min(z, 1); dz <= std::min(dims[2] - 1 - z, 1); ++dz)
        for (int dy = -std::min(y, 1); dy <= std::min(dims[1] - 1 - y, 1); ++dy)
            for (int dx = -std::min(x, 1); dx <= std::min(dims[0] - 1 - x, 1); ++dx) {
                const long i = (static_cast<long>(z + dz) * dims[1] + y + dy) * dims[0] + x + dx;
                if (std::abs(dx) + std::abs(dy) + std::abs(dz) <= reach &&
                    field.test(static_cast<unsigned long>(i)) == value)
                    return true;
            }
    return false;
}

}  // namespace

void morphologyByVoxel(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, MorphologyReach reach, bool erodes)
{
    unsigned long i = 0;
    for (int z = 0; z < dims[2]; ++z)
        for (int y = 0; y < dims[1]; ++y)
            for (int x = 0; x < dims[0]; ++x, ++i) {
                if (isAround(src, dims, x, y, z, static_cast<int>(reach), !erodes) != erodes)
                    dst.set(i);
                else
                    dst.unset(i);
            }
}

}  // namespace kplib::detail
