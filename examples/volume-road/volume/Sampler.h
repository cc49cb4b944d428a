#pragma once

#include "Volume.h"

#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpVec3f.h>

#include <algorithm>
#include <array>
#include <cmath>

/// What the voxels cover in the system of the voxels (see Space), half a voxel around their middles: also a single
/// slice has a thickness.
KpBox3f coveredBox(const Volume& volume);

/// Values of a volume between its voxels, at places in the system of the voxels. Uneven gaps are taken into account.
/// `Element` is the type of the volume's elements.
template <typename Element>
class Sampler {
public:
    /// The volume outlives the sampler.
    explicit Sampler(const Volume& volume) : volume_(volume), box_(coveredBox(volume)) {}

    bool contains(const KpVec3f& place) const { return box_.contains(place); }

    /// Interpolates each component between the eight voxels around a place within the box.
    void sample(const KpVec3f& place, Element* out) const
    {
        const Between x(place.x(), volume_.dims[0]), y(place.y(), volume_.dims[1]), z(level(place), volume_.dims[2]);
        for (int c = 0; c < volume_.components; ++c) {
            float sum = 0;
            for (int corner = 0; corner < 8; ++corner)
                sum += x.weight(corner & 1) * y.weight(corner & 2) * z.weight(corner & 4) *
                       static_cast<float>(element(x.voxel(corner & 1), y.voxel(corner & 2), z.voxel(corner & 4), c));
            out[c] = static_cast<Element>(std::lround(sum));
        }
    }

    /// The number of the voxel nearest to a place within the box.
    unsigned long nearest(const KpVec3f& place) const
    {
        const Between x(place.x(), volume_.dims[0]), y(place.y(), volume_.dims[1]), z(level(place), volume_.dims[2]);
        return static_cast<unsigned long>(number(x.nearest(), y.nearest(), z.nearest()));
    }

private:
    /// The voxels on both sides of a place on one axis, and the share of the upper one.
    struct Between {
        long low, high;
        float share;

        Between(float place, long size)
        {
            const float inside = std::clamp(place, 0.0F, static_cast<float>(size - 1));
            low = std::min(static_cast<long>(inside), std::max(0L, size - 2));
            high = std::min(low + 1, size - 1);
            share = inside - static_cast<float>(low);
        }
        long voxel(int isHigh) const { return isHigh ? high : low; }
        float weight(int isHigh) const { return isHigh ? share : 1 - share; }
        long nearest() const { return share < 0.5F ? low : high; }
    };

    float level(const KpVec3f& place) const
    {
        return static_cast<float>(volume_.sliceAt(static_cast<double>(place.z()) * volume_.spacing[2]));
    }
    long number(long x, long y, long z) const { return (z * volume_.dims[1] + y) * volume_.dims[0] + x; }
    Element element(long x, long y, long z, int component) const
    {
        return reinterpret_cast<const Element*>(volume_.bytes.data())[number(x, y, z) * volume_.components + component];
    }

    const Volume& volume_;
    KpBox3f box_;
};
