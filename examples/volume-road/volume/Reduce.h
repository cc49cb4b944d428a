#pragma once

#include "Volume.h"

#include <kplib/threads/KpProgressInterface.h>

#include <array>

// Reduces volumes by whole factors along the axes. An axis that is shorter than its factor becomes
// one voxel.

/// Each voxel is the mean of a block, or padding if the block contains padding.
Volume reducedByMean(Volume& volume, std::array<int, 3> factors, KpProgressInterface& progress);

/// Each voxel is the maximum of a block, component by component. Padding counts as a value.
Volume reducedByMaximum(Volume& volume, std::array<int, 3> factors, KpProgressInterface& progress);
