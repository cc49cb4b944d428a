#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVecBase.h>

/// Two floats: a point on a screen or in a picture.
class KPLIB_API KpVec2f : public KpVecBase<KpVec2f, float, 2> {
public:
    constexpr KpVec2f() = default;
    /// Of these components.
    constexpr KpVec2f(float x, float y) : KpVecBase(x, y) {}
    /// From a vector of another component type, each component converted as by static_cast.
    template <typename Vector, typename Component>
    constexpr explicit KpVec2f(const KpVecBase<Vector, Component, 2>& other) : KpVecBase(other)
    {
    }

    /// The length by std::hypot() in double, rounded to float; length() computes in float and may overflow.
    float hypot() const;
    /// Scales the vector to length 1 and returns its former length, hypot(). A vector of length 0
    /// stays unchanged, and 0 is returned.
    float normalize();
    /// The unsigned angle between the two in radians, from 0 to pi; NaN if one of them is zero.
    float angle(const KpVec2f& other) const;
};

static_assert(sizeof(KpVec2f) == 8);
