#include "Cut.h"

#include "Letters.h"

#include <kplib/geometry/KpMat4f.h>

namespace {

/// The voxels on both sides of a place on one axis, and the share of the upper one.
struct Between {
    long low, high;
    float share;

    Between(float place, long size)
    {
        const float inside = std::clamp(place, 0.0F, static_cast<float>(size - 1));
        low = std::min(static_cast<long>(inside), std::max(0L, size - 2));
        high = std::min(low + 1, size - 1);
        share = inside - static_cast<float>(low);
    }
    long nearest() const { return share < 0.5F ? low : high; }
};

class Sampler {
public:
    explicit Sampler(const Volume& volume) : volume_(volume), box_(coveredBox(volume)) {}

    bool contains(const KpVec3f& place) const { return box_.contains(place); }

    /// Sets the colour of a pixel and whether its nearest voxel is in the mask.
    void sample(const KpVec3f& place, const KpBitfield& mask, Picture& picture, long column, long row) const
    {
        const double height = static_cast<double>(place.z()) * volume_.spacing[2];
        const Between x(place.x(), volume_.dims[0]), y(place.y(), volume_.dims[1]),
            z(static_cast<float>(volume_.sliceAt(height)), volume_.dims[2]);
        for (int c = 0; c < 3; ++c)
            picture.at(column, row)[c] = valueAt(x, y, z, volume_.components == 3 ? c : 0);
        const auto nearest = static_cast<unsigned long>(voxel(x.nearest(), y.nearest(), z.nearest()));
        if (nearest < mask.nBits() && mask.test(nearest))
            picture.mark(column, row);
    }

private:
    long voxel(long x, long y, long z) const { return (z * volume_.dims[1] + y) * volume_.dims[0] + x; }

    unsigned char valueAt(const Between& x, const Between& y, const Between& z, int component) const
    {
        float sum = 0;
        for (const bool isAbove : {false, true}) {
            for (const bool isBelow : {false, true}) {
                for (const bool isRight : {false, true}) {
                    const float weight = (isRight ? x.share : 1 - x.share) * (isBelow ? y.share : 1 - y.share) *
                                         (isAbove ? z.share : 1 - z.share);
                    const long at = voxel(isRight ? x.high : x.low, isBelow ? y.high : y.low, isAbove ? z.high : z.low);
                    sum += weight * volume_.bytes[at * volume_.components + component];
                }
            }
        }
        return static_cast<unsigned char>(std::lround(sum));
    }

    const Volume& volume_;
    KpBox3f box_;
};

}  // namespace

KpBox3f coveredBox(const Volume& volume)
{
    constexpr float rounding = 1e-3F;  // of a voxel: middles at the very edge are inside
    const auto end = [&](size_t axis) { return static_cast<float>(volume.dims[axis]) - 0.5F + rounding; };
    const long last = volume.dims[2] - 1;
    const auto level = [&](double height) { return static_cast<float>(height / volume.spacing[2]); };
    return {-0.5F - rounding,
            end(0),
            -0.5F - rounding,
            end(1),
            level(volume.height(0) - volume.sliceExtent(0) / 2) - rounding,
            level(volume.height(last) + volume.sliceExtent(last) / 2) + rounding};
}

Picture cutByPlane(const Volume& shown, const Space& space, const KpBitfield& outline, const KpCoordinateSystem& plane,
                   const KpBox2f& extent, double pixel)
{
    const KpMat4f toVoxels = plane.transformationTo(*space.voxels);
    const double width = extent.size().x(), height = extent.size().y();
    Picture picture(pixelsFor(width, pixel), pixelsFor(height, pixel));
    const Sampler sampler(shown);
    const auto step = static_cast<float>(pixel);
    for (long row = 0; row < picture.height; ++row) {
        for (long column = 0; column < picture.width; ++column) {
            const KpVec3f inPlane(extent.xmin() + static_cast<float>(column) * step,
                                  extent.ymin() + static_cast<float>(row) * step, 0);
            const KpVec3f place = toVoxels.multVecMatrix(inPlane);
            if (sampler.contains(place))
                sampler.sample(place, outline, picture, column, row);
        }
    }
    drawLetters(picture,
                lettersOf(shown, plane.axis(KpCoordinateSystem::AxisX), plane.axis(KpCoordinateSystem::AxisY)));
    return picture;
}
