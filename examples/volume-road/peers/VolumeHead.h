#pragma once

#include "../dicom/Series.h"
#include "Parcel.h"

// An exported volume is one file: a prefix, a head (number of images, frame of reference, header tree, geometry,
// windows, warnings), and then the voxels, slice after slice.

constexpr unsigned int volumeMark = 0x58'41'52'56;  // "VRAX" in the file

/// What stands first in the file.
struct VolumePrefix {
    unsigned int mark;
    unsigned int headSize;
};

/// Appends prefix and head.
void writeHead(TmMsg& msg, const Series& series, const Volume& volume, const HxParamBundle& root);

/// Reads a head; false if it is damaged.
bool readHead(TmMsg& head, Series& series, Volume& volume, HxParamBundle& root);
