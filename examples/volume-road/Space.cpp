#include "Space.h"

#include <kplib/geometry/KpFrameOfReference.h>
#include <kplib/geometry/KpMat4f.h>

Space::Space(const std::string& frameUid, const Volume& volume) : patient(new KpFrameOfReference(frameUid))
{
    voxels = patient->createChildSystem();
    voxels->setOrigin(toVec(volume.origin));
    for (size_t i = 0; i < 3; ++i)
        voxels->setAxis(static_cast<KpCoordinateSystem::AxisIndex>(i),
                        toVec(volume.axes[i]) * static_cast<float>(volume.spacing[i]));
}

KpOrientationLetters lettersOf(const KpVec3f& right, const KpVec3f& down)
{
    KpMat4f image;
    image.setValue(right, down, right.cross(down), KpVec3f(0, 0, 0));
    return KpOrientationLetters(image);
}
