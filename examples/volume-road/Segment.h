#pragma once

#include "Space.h"

#include <kplib/geometry/KpBox3f.h>
#include <kplib/threads/KpProgressInterface.h>
#include <kplib/volume/KpBitfield.h>

#include <optional>

/// The largest connected region above a threshold: of a head, the head.
struct Region {
    double threshold = 0;  ///< displayed value; what is at or above it counts
    bool isThresholdGiven = false;
    int components = 0;        ///< how many regions there were
    unsigned long voxels = 0;  ///< of the largest
    double millilitres = 0;
    KpVec3f center{0, 0, 0};  ///< mm, in the patient
    KpBox3f box;              ///< mm, in the patient; empty without a region
    KpBitfield outline;       ///< the region's voxels that have a neighbour outside
};

/// Finds the region: at or above `threshold` (by Otsu's method, if there is none), without bridges of one voxel (an
/// opening), connected by faces, edges or corners. N. Otsu, "A threshold selection method from gray-level histograms",
/// 1979.
KpResult segment(Volume& volume, const Space& space, std::optional<double> threshold, KpProgressInterface& progress,
                 Region& region);
