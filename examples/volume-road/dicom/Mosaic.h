#pragma once

#include "Image.h"

#include <vector>

class DcmItem;

/// The slices of a mosaic: one image in which the slices of a volume stand side by side as tiles. The private header of
/// the scanner has their number and the direction from slice to slice; the image's own position is that of the mosaic
/// as a whole. Any other image is returned alone. A mosaic that lacks one of these has a problem.
std::vector<Image> unfolded(const Image& image, DcmItem& data);
