#pragma once

#include "Volume.h"

#include <string>
#include <vector>

/// Reads volume `number` (from 1) of a NIfTI file as 16-bit voxels with its place in the patient. Values that do not
/// fit are spread over the whole range of 16 bits, with the scale that leads back; each is then off by half a step at
/// most. A failure for a transformation that shears. `warnings` gets what is left out.
KpResult readNifti(const char* path, int number, Volume& volume, std::vector<std::string>& warnings);
