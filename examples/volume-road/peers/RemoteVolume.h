#pragma once

#include "../dicom/Series.h"

/// Writes a series as one raw file: a head (header tree, geometry, windows, warnings) and then the voxels, slice after
/// slice. A regular file appears at once or not at all; a device, a pipe or a link that is there is written through,
/// and
/// "-" is standard output. If `describe` is not empty, a JSON file of that name lists where
/// each slice is in the file and in the patient.
KpResult writeRemote(const std::string& file, const std::string& describe, const Series& series, Volume& volume,
                     const HxParamBundle& root);

/// Reads such a file from an HTTP server, slice by slice by ranges, on a thread of its own. Of the planes of the series
/// only the number and the frame of reference are known. Cancelling ends a read that waits. If the server is silent for
/// `timeout` seconds, the program ends (see Silence); 0 waits for ever.
KpResult readRemote(const std::string& url, int timeout, KpProgressInterface& progress, Series& series, Volume& volume,
                    HxParamBundle& root);
