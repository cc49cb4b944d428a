#pragma once

#include "../volume/Volume.h"

#include <initializer_list>

class DcmItem;
class DcmTag;

// Elements of a DICOM image that is being made.

void put(DcmItem& item, const DcmTag& tag, const char* text);
/// Decimal strings, with as many digits as they have room for.
void putReals(DcmItem& item, const DcmTag& tag, std::initializer_list<double> values);

/// Number, place, orientation, spacing and scale of slice `z`.
void putPlace(DcmItem& data, const Volume& volume, long z);

/// The pixels of slice `z` of a volume of 16-bit voxels or colours, and their format.
void putPixels(DcmItem& data, Volume& volume, long z);
