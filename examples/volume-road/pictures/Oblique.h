#pragma once

#include "Cut.h"

/// Writes oblique.png: a slice through the middle of a volume of bytes, tilted against all axes of the patient, seen
/// from the feet with the patient's left at the right. Voxels of `outline`, a mask of the volume's size, are marked.
KpResult writeOblique(const Volume& shown, const Space& space, const KpBitfield& outline, const OutputFolder& out);
