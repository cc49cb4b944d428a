#pragma once

#include <kplib/geometry/KpVecBase.h>

#include <cstdint>

/// Three signed 64-bit integers: sizes of volumes whose products exceed 32 bits.
class KpVec3l : public KpVecBase<KpVec3l, std::int64_t, 3> {
public:
    constexpr KpVec3l() = default;
    /// Of these components.
    constexpr KpVec3l(std::int64_t x, std::int64_t y, std::int64_t z) : KpVecBase(x, y, z) {}
    /// From a vector of another component type, each component converted as by static_cast.
    template <typename Vector, typename Component>
    constexpr explicit KpVec3l(const KpVecBase<Vector, Component, 3>& other) : KpVecBase(other)
    {
    }
};

static_assert(sizeof(KpVec3l) == 24);
