#pragma once

#include "Image.h"

#include <string>
#include <vector>

/// The planes of one volume, sorted by their places, and what distinguishes it from others of its series.
struct Part {
    std::vector<Image> planes;
    std::string label;
    bool isUncertain = false;  ///< the places have different numbers of planes, distinguished only by their order
};

/// Splits the planes of a series into volumes. Planes of another size, orientation, spacing, kind of pixels, frame of
/// reference, stack or segment belong to another volume. If several lie at one place, the volumes are distinguished by
/// the first trait that differs there, then by the next, and at last by the order of the images.
std::vector<Part> splitIntoVolumes(std::vector<Image> planes);
