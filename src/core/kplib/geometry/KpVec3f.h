#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVecBase.h>

#include <string>

/// Three floats: a point or a direction in space.
class KPLIB_API KpVec3f : public KpVecBase<KpVec3f, float, 3> {
public:
    constexpr KpVec3f() = default;
    /// Of these components.
    constexpr KpVec3f(float x, float y, float z) : KpVecBase(x, y, z) {}
    /// From a vector of another component type, each component converted as by static_cast.
    template <typename Vector, typename Component>
    constexpr explicit KpVec3f(const KpVecBase<Vector, Component, 3>& other) : KpVecBase(other)
    {
    }

    /// Scales the vector to length 1 and returns its former length. A vector of length 0 stays
    /// unchanged, and 0 is returned: planes and lines then become empty.
    float normalize() { return normalizeByLength(); }

    /// The signed unit axis that is nearest in direction. Among equally near ones, the first of
    /// +x, -x, +y, -y, +z, -z, which is +x for the zero vector. The zero vector if a component is
    /// NaN.
    KpVec3f getClosestAxis() const;

    /// {"x":"1.000000","y":"2.000000","z":"3.000000"}
    std::string dump() const;
};

static_assert(sizeof(KpVec3f) == 12);
