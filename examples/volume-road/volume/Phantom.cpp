#include "Phantom.h"

#include <kplib/rawdata/KpRawData.h>

#include <algorithm>
#include <array>
#include <cmath>

namespace {

struct Ellipsoid {
    KpVec3d center, radii;  // mm; x to the left, y to the back, z to the head
    short value;            // replaces what is below
};

// From the outside in: later ones lie within or upon earlier ones.
const Ellipsoid head[] = {
    {{0, 0, 0}, {75, 96, 88}, 620},        // scalp
    {{0, -97, -18}, {11, 14, 16}, 600},    // nose
    {{76, 6, -16}, {8, 14, 20}, 560},      // ears
    {{-76, 6, -16}, {8, 14, 20}, 560},     //
    {{0, 15, -75}, {48, 52, 40}, 520},     // neck
    {{0, 0, 2}, {69, 90, 82}, 90},         // skull
    {{0, 0, 4}, {63, 84, 76}, 150},        // liquor
    {{0, 0, 6}, {60, 81, 72}, 480},        // grey matter
    {{30, -2, 10}, {26, 68, 54}, 760},     // white matter, left and right
    {{-30, -2, 10}, {26, 68, 54}, 760},    //
    {{0, 44, -42}, {42, 26, 20}, 540},     // cerebellum
    {{9, -6, 14}, {6, 30, 16}, 130},       // ventricles
    {{-9, -6, 14}, {6, 30, 16}, 130},      //
    {{0, -2, -6}, {4, 8, 10}, 130},        //
    {{0, 12, -48}, {13, 13, 38}, 700},     // brain stem
    {{22, 2, -2}, {9, 16, 12}, 560},       // basal ganglia
    {{-22, 2, -2}, {9, 16, 12}, 560},      //
    {{36, 30, 22}, {10, 10, 10}, 980},     // tumour, enhanced
    {{36, 30, 22}, {5, 5, 5}, 250},        // its core
    {{30, -76, -16}, {12, 12, 12}, 260},   // eyes
    {{-30, -76, -16}, {12, 12, 12}, 260},  //
};

/// Where a line along x, at y and z, lies in an ellipsoid: half its length there, negative when it misses.
double halfChord(const Ellipsoid& e, double y, double z)
{
    const double v = (y - e.center[1]) / e.radii[1], w = (z - e.center[2]) / e.radii[2];
    const double rest = 1 - v * v - w * w;
    return rest < 0 ? -1 : e.radii[0] * std::sqrt(rest);
}

void fillRow(short* row, const Volume& volume, double y, double z)
{
    for (const Ellipsoid& e : head) {
        const double half = halfChord(e, y, z);
        if (half < 0)
            continue;
        const long from = std::max(0L, std::lround(std::ceil(e.center[0] - half - volume.origin[0])));
        const long to = std::min(volume.dims[0] - 1, std::lround(std::floor(e.center[0] + half - volume.origin[0])));
        std::fill(row + from, row + std::max(from, to + 1), e.value);
    }
}

}  // namespace

Volume makePhantom()
{
    Volume volume;
    volume.dims = {256, 256, 128};
    volume.spacing = KpVec3d(1, 1, 1.5);
    volume.origin = KpVec3d(-127.5, -127.5, -102);
    volume.allocate();
    KpRawData::memset(volume.voxels(), 0, volume.count());
    short* row = static_cast<short*>(volume.voxels().data);
    for (long z = 0; z < volume.dims[2]; ++z)
        for (long y = 0; y < volume.dims[1]; ++y, row += volume.dims[0])
            fillRow(row, volume, volume.origin[1] + static_cast<double>(y),
                    volume.origin[2] + static_cast<double>(z) * volume.spacing[2]);
    return volume;
}
