#pragma once

#include "VolumeHead.h"

#include <string>

/// Writes a series as one file, see VolumeHead.h. A regular file appears at once or not at all; a device, a pipe or a
/// link that is there is written through, and "-" is standard output. If `describe` is not empty, a JSON file of that
/// name lists where each slice is in the file and in the patient.
KpResult writeExport(const std::string& file, const std::string& describe, const Series& series, Volume& volume,
                     const HxParamBundle& root);
