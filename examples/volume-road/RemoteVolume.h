#pragma once

#include "DicomSeries.h"

/// Writes a series as one raw file: a head (header tree, geometry, number of images) and behind it the voxels, slice
/// after slice. It appears whole or not at all.
KpResult exportVolume(const std::string& folder, const std::string& uid, const std::string& file,
                      KpProgressInterface& progress);

/// Reads such a file from an HTTP server, slice by slice by ranges, on a thread of its own. Of the series it tells the
/// number of images and their frame of reference. Cancelling ends a read that waits.
KpResult readRemote(const std::string& url, KpProgressInterface& progress, Series& series, Volume& volume,
                    HxParamBundle& root);
