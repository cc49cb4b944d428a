#pragma once

#include <kplib/geometry/KpVecBase.h>

#include <cstdint>

/// Two signed 32-bit integers: a pixel, a size in pixels.
class KpVec2i : public KpVecBase<KpVec2i, std::int32_t, 2> {
public:
    constexpr KpVec2i() = default;
    /// Of these components.
    constexpr KpVec2i(std::int32_t x, std::int32_t y) : KpVecBase(x, y) {}
    /// From a vector of another component type, each component converted as by static_cast.
    template <typename Vector, typename Component>
    constexpr explicit KpVec2i(const KpVecBase<Vector, Component, 2>& other) : KpVecBase(other)
    {
    }
};

static_assert(sizeof(KpVec2i) == 8);
