#pragma once

#include "BadInput.h"

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpPrimType.h>
#include <kplib/foundation/KpString.h>
#include <kplib/geometry/KpVec3d.h>
#include <kplib/log/KpResult.h>
#include <kplib/rawdata/KpTypedPointer.h>

#include <array>
#include <cmath>
#include <vector>

/// Stored values that stand for "no measurement", both ends included; none if `low` is above `high`.
struct Padding {
    double low = 1, high = 0;

    bool isPresent() const { return low <= high; }
    bool contains(double stored) const { return stored >= low && stored <= high; }
};

/// Voxels in one block, x fastest, and their places in the patient: mm, x to the left, y to the back, z to the head.
///
/// Voxel (x, y, z) is at origin + x spacing[0] axes[0] + y spacing[1] axes[1] + height(z) axes[2]. The third axis is
/// the direction from slice to slice. It need not be at right angles to the two others: a scan with a tilted gantry is
/// sheared, and so is its volume. Displayed value = stored value * slope + intercept.
struct Volume {
    std::array<long, 3> dims{};
    int components = 1;  ///< interleaved values of a voxel: 1, or 3 bytes of red, green and blue
    KpVec3d spacing{1, 1, 1};
    KpVec3d origin{0, 0, 0};
    std::array<KpVec3d, 3> axes{KpVec3d(1, 0, 0), KpVec3d(0, 1, 0), KpVec3d(0, 0, 1)};
    std::vector<double> heights;  ///< mm of each slice along axes[2], ascending from 0; empty if the gaps are even
    bool isPlaced = true;         ///< origin and axes are known, not assumed
    bool isPlaneScaled = true;    ///< the spacing of columns and rows is known, not assumed
    bool isScaled = true;         ///< all three are: lengths in space and volumes may be given
    double slope = 1, intercept = 0;
    Padding padding;
    KpPrimType type = KpPrimType::Short;
    KpDArray<unsigned char> bytes;

    long count() const { return dims[0] * dims[1] * dims[2]; }
    long sliceCount() const { return dims[0] * dims[1]; }
    long sliceBytes() const { return sliceCount() * components * type.size(); }
    KpTypedPointer voxels() { return {bytes.data(), type}; }
    KpTypedPointer slice(long z) { return {bytes.data() + z * sliceBytes(), type}; }
    void allocate() { bytes.resize(dims[2] * sliceBytes()); }

    double height(long z) const
    {
        return heights.empty() ? static_cast<double>(z) * spacing[2] : heights[static_cast<size_t>(z)];
    }
    KpVec3d slicePosition(long z) const { return origin + axes[2] * height(z); }
    /// The slice number, with fraction, at a height; the first and last gap continue outside.
    double sliceAt(double height) const;
    /// mm along axes[2] that slice `z` stands for: half of both gaps.
    double sliceExtent(long z) const;
    /// mm3 of a voxel of slice `z`.
    double voxelVolume(long z) const
    {
        return std::abs(axes[0].cross(axes[1]).dot(axes[2])) * spacing[0] * spacing[1] * sliceExtent(z);
    }
    /// Degrees between the third axis and the normal of the slices.
    double tilt() const;
    /// The same place, scale and kind of values; no voxels.
    Volume withoutVoxels() const;
};

constexpr double shortestLength = 1e-4, longestLength = 1e6;  // mm; beyond lies no length of a patient

inline bool isLength(double mm)
{
    return mm >= shortestLength && mm <= longestLength;
}

/// Whether these are a place and two unit directions at right angles.
bool isPlace(const KpVec3d& position, const KpVec3d& row, const KpVec3d& column);

/// Smallest and largest displayed value; padding is left out.
std::array<double, 2> displayedRange(Volume& volume);

/// The luminance of a colour volume as bytes; other volumes cannot be asked.
Volume luminanceOf(const Volume& colour);
