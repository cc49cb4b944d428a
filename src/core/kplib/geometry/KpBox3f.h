#pragma once

#include <kplib/geometry/KpBox3Base.h>
#include <kplib/geometry/KpVec3f.h>

/// An axis-aligned box in space: three intervals of floats.
class KpBox3f : public KpBox3Base<KpBox3f, KpVec3f> {
public:
    constexpr KpBox3f() = default;
    /// Of these bounds as they are.
    constexpr KpBox3f(float xmin, float xmax, float ymin, float ymax, float zmin, float zmax) :
        KpBox3Base(xmin, xmax, ymin, ymax, zmin, zmax)
    {
    }
    /// From the two corners as they are: a minimum above its maximum makes the box empty.
    constexpr KpBox3f(const KpVec3f& min, const KpVec3f& max) :
        KpBox3Base(min.x(), max.x(), min.y(), max.y(), min.z(), max.z())
    {
    }
};

static_assert(sizeof(KpBox3f) == 24);
