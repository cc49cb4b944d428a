#pragma once

#include <kplib/geometry/KpVecBase.h>

/// Three doubles: a point or a direction in space where float is not enough.
class KpVec3d : public KpVecBase<KpVec3d, double, 3> {
public:
    constexpr KpVec3d() = default;
    /// Of these components.
    constexpr KpVec3d(double x, double y, double z) : KpVecBase(x, y, z) {}
    /// From a vector of another component type, each component converted as by static_cast.
    template <typename Vector, typename Component>
    constexpr explicit KpVec3d(const KpVecBase<Vector, Component, 3>& other) : KpVecBase(other)
    {
    }

    /// Scales the vector to length 1 and returns its former length. A vector of length 0 stays
    /// unchanged, and 0 is returned.
    double normalize() { return normalizeByLength(); }
};

static_assert(sizeof(KpVec3d) == 24);
