#pragma once

#include "Volume.h"

/// A head of ellipsoids, 256 x 256 x 128 voxels of 16 bit, 1 x 1 x 1.5 mm: scalp, skull, brain, ventricles, eyes, nose,
/// ears and a tumour, with values like those of a T1-weighted MR image. A relative of the head phantom of L. A. Shepp
/// and B. F. Logan, "The Fourier reconstruction of a head section", IEEE Trans. Nucl. Sci. 21, 1974.
Volume makePhantom();
