#pragma once

#include "Cut.h"

#include <array>

/// The axes of a volume in the order of the patient's: to the left, the back and the head.
struct PatientAxis {
    size_t axis;
    bool isReversed;
    KpVec3d direction;  ///< unit, in the patient; the slices' own normal, also in a sheared volume
};
std::array<PatientAxis, 3> patientAxes(const Volume& volume);

/// Writes axial.png, coronal.png and sagittal.png through the middle of a volume of bytes, the patient upright and seen
/// as usual (left on the right side of the picture), with square pixels and the orientation's letters at the edges.
/// Voxels of `outline`, a mask of the volume's size, are marked.
KpResult writePlanes(const Volume& shown, const Space& space, const KpBitfield& outline, const OutputFolder& out);

/// Writes the axial one of these pictures alone.
KpResult writeAxial(const Volume& shown, const Space& space, const KpBitfield& outline, const OutputFolder& out,
                    const char* name);

/// Writes all slices of a volume of bytes side by side, with the letters of a slice at the edges.
KpResult writeOverview(Volume& shown, const OutputFolder& out, const char* name);
