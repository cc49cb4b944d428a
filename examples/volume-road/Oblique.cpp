#include "Oblique.h"

#include "Letters.h"

#include <kplib/geometry/KpBox2f.h>
#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpCutBoxPlane.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpPlane.h>

#include <algorithm>
#include <cmath>

namespace {

const KpVec3f obliqueNormal(0.3F, -0.45F, 0.84F);  // between the head, the front and the left

/// What the voxels cover, half a voxel around their middles: also a single slice has a thickness.
KpBox3f coveredBox(const Volume& volume)
{
    const auto end = [&](size_t axis) { return static_cast<float>(volume.dims[axis]) - 0.5F; };
    return {-0.5F, end(0), -0.5F, end(1), -0.5F, end(2)};
}

/// The system of the slice: z along the normal, x as near to the patient's left as can be, so that y runs to the back.
KpHandle<KpCoordinateSystem> sliceSystem(const Volume& volume, const Space& space)
{
    const KpBox3f box = coveredBox(volume);
    KpHandle<KpCoordinateSystem> slice = space.patient->createChildSystem();
    slice->setAxes(obliqueNormal, KpVec3f(1, 0, 0));
    slice->setOrigin(space.voxels->asTransformation().multVecMatrix((box.min() + box.max()) / 2.0F));
    return slice;
}

/// What the volume covers of the slice, in the slice's own x and y.
KpBox2f extentOf(const Volume& volume, const Space& space, const KpCoordinateSystem& slice)
{
    const KpMat4f toVoxels = slice.transformationTo(*space.voxels);
    const KpMat4f toSlice = toVoxels.inverse();
    const KpVec3f right = toVoxels.multDirMatrix(KpVec3f(1, 0, 0)), down = toVoxels.multDirMatrix(KpVec3f(0, 1, 0));
    const KpPlane inVoxels(right.cross(down), toVoxels.multVecMatrix(KpVec3f(0, 0, 0)));
    KpBox2f extent;
    for (const KpVec3f& corner : KpCutBoxPlane::cutPlane(coveredBox(volume), inVoxels)) {
        const KpVec3f inSlice = toSlice.multVecMatrix(corner);
        extent.extendBy(KpVec2f(inSlice.x(), inSlice.y()));
    }
    return extent;
}

/// The value between the eight voxels around a place, at the border of those there are; black outside.
class Sampler {
public:
    explicit Sampler(const Volume& volume) : volume_(volume), box_(coveredBox(volume)) {}

    unsigned char at(const KpVec3f& place) const
    {
        if (!box_.contains(place))
            return 0;
        long corner[3];
        float share[3];
        for (int axis = 0; axis < 3; ++axis) {
            const long last = volume_.dims[size_t(axis)] - 1;
            const float inside = std::clamp(place[axis], 0.0F, static_cast<float>(last));
            corner[axis] = std::min(static_cast<long>(inside), std::max(0L, last - 1));
            share[axis] = inside - static_cast<float>(corner[axis]);
        }
        float sum = 0;
        for (int i = 0; i < 8; ++i) {
            float weight = 1;
            long voxel[3];
            for (int axis = 0; axis < 3; ++axis) {
                const bool isUpper = (i >> axis & 1) != 0;
                weight *= isUpper ? share[axis] : 1 - share[axis];
                voxel[axis] = std::min(corner[axis] + isUpper, volume_.dims[size_t(axis)] - 1);
            }
            sum += weight * volume_.bytes[(voxel[2] * volume_.dims[1] + voxel[1]) * volume_.dims[0] + voxel[0]];
        }
        return static_cast<unsigned char>(std::lround(sum));
    }

    /// Whether the voxel that the place lies in is set.
    bool isMarked(const KpVec3f& place, const KpBitfield& mask) const
    {
        if (!box_.contains(place))
            return false;
        long voxel[3];
        for (int axis = 0; axis < 3; ++axis)
            voxel[axis] = std::clamp(std::lround(place[axis]), 0L, volume_.dims[size_t(axis)] - 1);
        return mask.test(
            static_cast<unsigned long>((voxel[2] * volume_.dims[1] + voxel[1]) * volume_.dims[0] + voxel[0]));
    }

private:
    const Volume& volume_;
    KpBox3f box_;
};

}  // namespace

KpResult writeOblique(const Volume& shown, const Space& space, const KpBitfield& outline, const OutputFolder& out)
{
    const KpHandle<KpCoordinateSystem> slice = sliceSystem(shown, space);
    const KpBox2f extent = extentOf(shown, space, *slice);
    if (extent.isEmpty())
        return badInput("the volume lies too far away for the size of its voxels");
    const KpMat4f toVoxels = slice->transformationTo(*space.voxels);
    const double width = extent.size().x(), height = extent.size().y();
    const double finest = *std::min_element(shown.spacing.begin(), shown.spacing.end());
    const auto pixel = static_cast<float>(pixelSize(finest, width, height));
    Picture picture(pixelsFor(width, pixel), pixelsFor(height, pixel));
    const Sampler sampler(shown);
    for (long row = 0; row < picture.height; ++row) {
        for (long column = 0; column < picture.width; ++column) {
            const KpVec3f inSlice(extent.xmin() + static_cast<float>(column) * pixel,
                                  extent.ymin() + static_cast<float>(row) * pixel, 0);
            const KpVec3f place = toVoxels.multVecMatrix(inSlice);
            picture.set(column, row, sampler.at(place));
            if (sampler.isMarked(place, outline))
                picture.mark(column, row);
        }
    }
    drawLetters(picture,
                lettersOf(shown, slice->axis(KpCoordinateSystem::AxisX), slice->axis(KpCoordinateSystem::AxisY)));
    return writePng(picture, out, "oblique.png");
}
