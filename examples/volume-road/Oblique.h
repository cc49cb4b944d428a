#pragma once

#include "Picture.h"
#include "Space.h"

/// Writes oblique.png: a slice through the middle of a volume of bytes, tilted against all axes of the patient, seen
/// from the feet with the patient's left at the right.
KpResult writeOblique(const Volume& shown, const Space& space, const OutputFolder& out);
