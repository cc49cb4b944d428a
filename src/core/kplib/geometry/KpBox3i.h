#pragma once

#include <kplib/geometry/KpBox3Base.h>
#include <kplib/geometry/KpVec3i.h>

/// An axis-aligned box of voxels: three intervals of 32-bit integers, both ends inside.
class KpBox3i : public KpBox3Base<KpBox3i, KpVec3i> {
public:
    constexpr KpBox3i() = default;
    /// Of these bounds as they are.
    constexpr KpBox3i(std::int32_t xmin, std::int32_t xmax, std::int32_t ymin, std::int32_t ymax, std::int32_t zmin,
                      std::int32_t zmax) :
        KpBox3Base(xmin, xmax, ymin, ymax, zmin, zmax)
    {
    }
    /// From any two opposite corners, sorted on each axis: never empty.
    constexpr KpBox3i(const KpVec3i& a, const KpVec3i& b) : KpBox3i(a.x(), a.x(), a.y(), a.y(), a.z(), a.z())
    {
        extendBy(b);
    }
};

static_assert(sizeof(KpBox3i) == 24);
