#pragma once

#include "../pictures/Window.h"
#include "../volume/Segment.h"

#include <kplib/foundation/Kp128.h>
#include <kplib/net/TmMsg.h>
#include <kplib/param/HxParamBundle.h>

#include <string>

/// What one peer hands to another: a volume with its parameters, its place in the patient, and what was found in it.
struct Parcel {
    std::string frameUid;
    HxParamBundle root{"Volume"};
    Volume volume;
    Window window;
    Region region;
};

/// Sizes, type, place and scale of a volume, without its voxels.
void writeGeometry(TmMsg& msg, const Volume& volume);
bool readGeometry(TmMsg& msg, Volume& volume);  ///< false if it cannot be that of a volume

/// The children of a bundle.
void writeTree(TmMsg& msg, const HxParamBundle& bundle);
bool readTree(TmMsg& msg, HxParamBundle& bundle);

/// Digest of type, sizes and voxels.
Kp128 contentHash(Volume& volume);
std::string hexadecimal(const Kp128& hash);

/// All of it as one message, the content hash too.
void writeParcel(TmMsg& msg, Parcel& parcel);
/// A failure if the message isn't whole, or if the voxels aren't those that were hashed.
KpResult readParcel(TmMsg& msg, Parcel& parcel);
