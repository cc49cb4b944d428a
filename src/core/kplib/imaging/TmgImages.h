#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

#include <set>
#include <string>

// Data of each image of a volume, in the parameters of the volume: beside `DICOM` a bundle
// `ImageNumberList`. Its first child is `NumImageNumbers`; the others are one text for each image,
// `ImageNr00001` ... in the order of the images. A text contains fields separated by commas, named
// by the tags in the parameter `ImageLevelTags`; its first field is the image number. Images are
// found by their position, so such a list must never be sorted, which HxParamBundle::findSorted()
// on it does. A sort moves `NumImageNumbers` after all texts and so shifts every image by one;
// with names of more than five digits it changes their order too. No function here sorts it.
//
// Failure is false. Threads as with HxParamBundle.

namespace Tmg {

/// Tags whose value is assumed to be the same in all images of a volume, so that the first image
/// is read for all. Exists from static initialisation to exit.
KPLIB_API extern const std::set<std::string> tagsConstantInVolume;

/// Replaces all that `list` holds by the texts of the images; no texts leave it empty.
KPLIB_API void setImageTagList(HxParamBundle* list, const KpDArray<KpString>& texts);

/// The number of image `index`, counted from 0; false without that image.
KPLIB_API bool imageNumberFromBundle(const HxParamBundle* list, int index, int& out);
/// The same from the `ImageNumberList` of `object`, or else the instance number (0020,0013) of its header. `out` is 0
/// if there is neither.
KPLIB_API bool imageNumber(const HxParamBundle& object, int index, int& out);
/// The numbers of the images `first` to `last`, both cut to those that there are. Without a list `out` stays.
KPLIB_API void imageNumbers3D(const HxParamBundle& object, int first, int last, KpDArray<int>& out);

/// The frame of image `index` in an object of two or more frames (0028,0008): `index` itself in an
/// enhanced one, else the number after the last point of its stored SOP Instance UID. findSorted()
/// sorts the header.
KPLIB_API bool frameNumber(const HxParamBundle& object, bool enhanced, int index, int& out);

/// The value of a tag for image `index`: its own if `ImageLevelTags` names the tag (any name that
/// holds `tag` counts as that), else that of the header. `approximate` is set if the value is the
/// volume's and may differ for this image, which is never so for a single image or a tag of
/// tagsConstantInVolume. False, with `approximate` set all the same, if there is no value, or an
/// empty one of the image's own.
KPLIB_API bool imageLevelTag(const HxParamBundle& object, int index, const char* tag, KpString& value,
                             bool& approximate);

}  // namespace Tmg
