#pragma once

#include "Image.h"

#include <array>
#include <string>
#include <vector>

/// Where the planes of a volume lie, in order of their places.
struct Geometry {
    KpVec3d origin{0, 0, 0};
    std::array<KpVec3d, 3> axes{KpVec3d(1, 0, 0), KpVec3d(0, 1, 0), KpVec3d(0, 0, 1)};
    KpVec3d spacing{1, 1, 1};
    std::vector<double> heights;  ///< as in Volume
    bool isPlaced = false, isPlaneScaled = true, isScaled = true;
    std::vector<std::string> warnings;
};

/// Measures the step from plane to plane. The planes agree in orientation and spacing and are sorted; each has a place
/// of its own. A failure if they do not lie on one straight line.
KpResult geometryOf(const std::vector<Image>& planes, Geometry& geometry);
