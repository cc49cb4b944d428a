#include "Cut.h"

#include "../volume/Sampler.h"
#include "Letters.h"

#include <kplib/geometry/KpMat4f.h>

Picture cutByPlane(const Volume& shown, const Space& space, const KpBitfield& outline, const KpCoordinateSystem& plane,
                   const KpBox2f& extent, double pixel)
{
    const KpMat4f toVoxels = plane.transformationTo(*space.voxels);
    const auto width = static_cast<double>(extent.size().x()), height = static_cast<double>(extent.size().y());
    Picture picture(pixelsFor(width, pixel), pixelsFor(height, pixel));
    const Sampler<unsigned char> sampler(shown);
    const auto step = static_cast<float>(pixel);
    for (long row = 0; row < picture.height; ++row) {
        for (long column = 0; column < picture.width; ++column) {
            const KpVec3f inPlane(extent.xmin() + static_cast<float>(column) * step,
                                  extent.ymin() + static_cast<float>(row) * step, 0);
            const KpVec3f place = toVoxels.multVecMatrix(inPlane);
            if (!sampler.contains(place))
                continue;
            unsigned char* const colour = picture.at(column, row);
            sampler.sample(place, colour);
            if (shown.components == 1)
                colour[1] = colour[2] = colour[0];
            if (const unsigned long voxel = sampler.nearest(place); voxel < outline.nBits() && outline.test(voxel))
                picture.mark(column, row);
        }
    }
    drawLetters(picture,
                lettersOf(shown, plane.axis(KpCoordinateSystem::AxisX), plane.axis(KpCoordinateSystem::AxisY)));
    return picture;
}
