#include "Oblique.h"

#include "../volume/Sampler.h"

#include <kplib/geometry/KpCutBoxPlane.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpPlane.h>

#include <algorithm>
#include <vector>

namespace {

const KpVec3f obliqueNormal(0.3F, -0.45F, 0.84F);  // between the head, the front and the left

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

}  // namespace

KpResult writeOblique(const Volume& shown, const Space& space, const KpBitfield& outline, const OutputFolder& out)
{
    const KpHandle<KpCoordinateSystem> slice = sliceSystem(shown, space);
    const KpBox2f extent = extentOf(shown, space, *slice);
    if (extent.isEmpty())
        return badInput("the volume lies too far away for the size of its voxels");
    const double finest = *std::min_element(shown.spacing.begin(), shown.spacing.end());
    const double pixel =
        pixelSize(finest, static_cast<double>(extent.size().x()), static_cast<double>(extent.size().y()));
    return writePng(cutByPlane(shown, space, outline, *slice, extent, pixel), out, "oblique.png");
}
