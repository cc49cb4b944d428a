#pragma once

#include "Volume.h"

/// Reads the first volume of a NIfTI file as 16-bit voxels with its place in the patient.
KpResult readNifti(const char* path, Volume& volume);
