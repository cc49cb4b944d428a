#pragma once

#include <kplib/geometry/KpVec3f.h>
#include <kplib/geometry/KpVecBase.h>

/// Four floats: a point in homogeneous coordinates, a row of a KpMat4f.
class KpVec4f : public KpVecBase<KpVec4f, float, 4> {
public:
    constexpr KpVec4f() = default;
    /// Of these components.
    constexpr KpVec4f(float x, float y, float z, float w) : KpVecBase(x, y, z, w) {}
    /// Of the components of `v` and of `w`.
    constexpr KpVec4f(const KpVec3f& v, float w) : KpVecBase(v.x(), v.y(), v.z(), w) {}
    /// From a vector of another component type, each component converted as by static_cast.
    template <typename Vector, typename Component>
    constexpr explicit KpVec4f(const KpVecBase<Vector, Component, 4>& other) : KpVecBase(other)
    {
    }

    /// Scales the vector to length 1 and returns its former length. A vector of length 0 stays
    /// unchanged, and 0 is returned.
    float normalize() { return normalizeByLength(); }
};

static_assert(sizeof(KpVec4f) == 16);
