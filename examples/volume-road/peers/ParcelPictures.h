#pragma once

#include "../commands/OutputFolder.h"
#include "Parcel.h"

/// The pictures of a parcel, which are the same on both sides.
KpResult writePictures(Parcel& parcel, const OutputFolder& out);
