#pragma once

#include <kplib/geometry/KpVecBase.h>

#include <cstdint>

/// Three signed 32-bit integers: a voxel, a size in voxels.
class KpVec3i : public KpVecBase<KpVec3i, std::int32_t, 3> {
public:
    constexpr KpVec3i() = default;
    /// Of these components.
    constexpr KpVec3i(std::int32_t x, std::int32_t y, std::int32_t z) : KpVecBase(x, y, z) {}
    /// From a vector of another component type, each component converted as by static_cast.
    template <typename Vector, typename Component>
    constexpr explicit KpVec3i(const KpVecBase<Vector, Component, 3>& other) : KpVecBase(other)
    {
    }
};

static_assert(sizeof(KpVec3i) == 12);
