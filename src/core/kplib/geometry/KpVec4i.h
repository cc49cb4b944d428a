#pragma once

#include <kplib/geometry/KpVecBase.h>

#include <cstdint>

/// Four signed 32-bit integers.
class KpVec4i : public KpVecBase<KpVec4i, std::int32_t, 4> {
public:
    constexpr KpVec4i() = default;
    /// Of these components.
    constexpr KpVec4i(std::int32_t x, std::int32_t y, std::int32_t z, std::int32_t w) : KpVecBase(x, y, z, w) {}
    /// From a vector of another component type, each component converted as by static_cast.
    template <typename Vector, typename Component>
    constexpr explicit KpVec4i(const KpVecBase<Vector, Component, 4>& other) : KpVecBase(other)
    {
    }
};

static_assert(sizeof(KpVec4i) == 16);
