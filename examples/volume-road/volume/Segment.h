#pragma once

#include "Space.h"

#include <kplib/geometry/KpBox3f.h>
#include <kplib/threads/KpProgressInterface.h>
#include <kplib/volume/KpBitfield.h>

#include <optional>

/// The largest connected region above a threshold: of a head, the head.
struct Region {
    double threshold = 0;  ///< displayed value; voxels at or above it count, padding does not
    bool isThresholdGiven = false;
    int components = 0;        ///< number of regions
    unsigned long voxels = 0;  ///< of the largest
    double millilitres = 0;    ///< not valid if the volume is not scaled
    KpVec3f center{0, 0, 0};   ///< mm, in the patient
    KpBox3f box;               ///< mm, in the patient; empty without a region
    KpBitfield mask;           ///< the region's voxels
    KpBitfield outline;        ///< the region's voxels that have a neighbour outside
};

/// Finds the region: at or above `threshold` (by Otsu's method, if there is none), without bridges of one voxel (an
/// opening), connected by faces, edges or corners. Colour volumes are segmented by their luminance. N. Otsu, "A
/// threshold selection method from gray-level histograms", 1979.
///
/// Memory: two bytes a voxel of the box around the voxels above the threshold, and three masks.
KpResult segment(Volume& volume, const Space& space, std::optional<double> threshold, KpProgressInterface& progress,
                 Region& region);
