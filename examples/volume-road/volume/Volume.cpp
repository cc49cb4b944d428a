#include "Volume.h"

#include <kplib/rawdata/KpRawData.h>

#include <algorithm>
#include <cmath>
#include <limits>

double Volume::sliceAt(double height) const
{
    if (heights.size() < 2)
        return height / spacing[2];
    const auto above = std::upper_bound(heights.begin() + 1, heights.end() - 1, height);
    const double low = *(above - 1);
    return static_cast<double>(above - 1 - heights.begin()) + (height - low) / (*above - low);
}

double Volume::sliceExtent(long z) const
{
    if (heights.size() < 2)
        return spacing[2];
    const long last = dims[2] - 1;
    const double before = z > 0 ? height(z) - height(z - 1) : height(1) - height(0);
    const double after = z < last ? height(z + 1) - height(z) : height(last) - height(last - 1);
    return (before + after) / 2;
}

double Volume::tilt() const
{
    const KpVec3d normal = axes[0].cross(axes[1]);
    const double across = normal.cross(axes[2]).length(), along = normal.dot(axes[2]);
    return std::atan2(across, along) * 180 / M_PI;
}

Volume Volume::withoutVoxels() const
{
    Volume copy;
    copy.dims = dims;
    copy.components = components;
    copy.spacing = spacing;
    copy.origin = origin;
    copy.axes = axes;
    copy.heights = heights;
    copy.isPlaced = isPlaced;
    copy.isPlaneScaled = isPlaneScaled;
    copy.isScaled = isScaled;
    copy.slope = slope;
    copy.intercept = intercept;
    copy.padding = padding;
    copy.type = type;
    return copy;
}

bool isPlace(const KpVec3d& position, const KpVec3d& row, const KpVec3d& column)
{
    constexpr double tolerance = 1e-3;  // of a 256 mm field this is a quarter of a millimetre
    return position.length() <= longestLength && std::abs(row.length() - 1) < tolerance &&
           std::abs(column.length() - 1) < tolerance && std::abs(row.dot(column)) < tolerance;
}

std::array<double, 2> displayedRange(Volume& volume)
{
    double low = std::numeric_limits<double>::infinity(), high = -low;
    const long n = volume.sliceCount() * volume.components;
    KpDArray<double> values;
    values.resize(n);
    for (long z = 0; z < volume.dims[2]; ++z) {
        KpRawData::memcpy({values.data(), KpPrimType::Double}, volume.slice(z), n);
        for (const double v : values) {
            if (std::isnan(v) || volume.padding.contains(v))
                continue;
            low = std::min(low, v);
            high = std::max(high, v);
        }
    }
    if (low > high)
        return {0, 0};
    const double a = low * volume.slope + volume.intercept, b = high * volume.slope + volume.intercept;
    return {std::min(a, b), std::max(a, b)};
}

Volume luminanceOf(const Volume& colour)
{
    Volume grey = colour.withoutVoxels();
    grey.components = 1;
    grey.allocate();
    // ITU-R BT.601, in parts of 1000
    for (long i = 0; i < grey.count(); ++i) {
        const unsigned char* const rgb = colour.bytes.data() + 3 * i;
        grey.bytes[i] = static_cast<unsigned char>((299 * rgb[0] + 587 * rgb[1] + 114 * rgb[2] + 500) / 1000);
    }
    return grey;
}
