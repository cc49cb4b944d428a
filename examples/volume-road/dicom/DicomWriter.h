#pragma once

#include "../volume/Volume.h"

#include <kplib/threads/KpProgressInterface.h>

/// What the headers of a made series say of it.
struct SeriesText {
    const char* studyDescription;
    const char* seriesDescription;
    const char* source;
    double windowCenter, windowWidth;  ///< in displayed values
};

/// Writes a volume of 16-bit voxels as a series of MR images into `folder`, one file a slice, each a complete object
/// with UIDs, place and orientation, window, a private block and a sequence.
KpResult writeSeries(Volume& volume, const SeriesText& text, const char* folder, KpProgressInterface& progress);
