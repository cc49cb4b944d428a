#pragma once

#include "Volume.h"

#include <kplib/geometry/shapes/Angle2D.h>
#include <kplib/geometry/shapes/Ellipse2D.h>
#include <kplib/geometry/shapes/Polygon2D.h>
#include <kplib/volume/KpBitfield.h>

#include <algorithm>
#include <array>

/// The middle slice of a volume of bytes with the outline of a region, in mm along its rows and columns.
class MiddleSlice {
public:
    MiddleSlice(const Volume& volume, const KpBitfield& outline) : volume_(volume), outline_(outline) {}

    double pixel() const { return std::min(volume_.spacing[0], volume_.spacing[1]); }
    KpVec2f size() const { return {extent(0), extent(1)}; }
    long width() const { return volume_.dims[0]; }
    long height() const { return volume_.dims[1]; }
    bool isOutline(long x, long y) const;
    KpVec2f at(long x, long y) const;
    /// The colour of the voxel nearest to a place.
    std::array<unsigned char, 3> colour(const KpVec2f& place) const;

private:
    long first() const { return volume_.dims[2] / 2 * volume_.sliceCount(); }
    float extent(int axis) const
    {
        return static_cast<float>(static_cast<double>(volume_.dims[static_cast<size_t>(axis)] - 1) *
                                  volume_.spacing[axis]);
    }

    const Volume& volume_;
    const KpBitfield& outline_;
};

/// What is measured in the slice.
struct SliceShapes {
    Polygon2D outline, simplified;  ///< the outermost points, and without those within 1 mm of the line
    Ellipse2D ellipse;
    Angle2D angle;
};

SliceShapes shapesOf(const MiddleSlice& slice);

/// By the trapezoids under the sides.
double areaOf(const Polygon2D& polygon);
