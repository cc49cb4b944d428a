#pragma once

#include "Volume.h"

#include <kplib/threads/KpProgressInterface.h>

#include <array>

// Volumes with fewer voxels, by whole factors along the axes; an axis that is shorter than its factor becomes one
// voxel.

/// Each voxel is the mean of a block; padding if the block holds padding.
Volume reducedByMean(Volume& volume, std::array<int, 3> factors, KpProgressInterface& progress);

/// Each voxel is the maximum of a block and its neighbours.
Volume reducedByMaximum(Volume& volume, std::array<int, 3> factors, KpProgressInterface& progress);
