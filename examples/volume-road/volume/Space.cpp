#include "Space.h"

#include <kplib/geometry/KpMat4f.h>

#include <array>

Space::Space(const std::string& frameUid, const Volume& volume) : patient(new KpFrameOfReference(frameUid))
{
    voxels = patient->createChildSystem();
    voxels->setOrigin(KpVec3f(volume.origin));
    for (int i = 0; i < 3; ++i)
        voxels->setAxis(i, KpVec3f(volume.axes[static_cast<size_t>(i)] * volume.spacing[i]));
}

KpOrientationLetters lettersOf(const Volume& volume, const KpVec3f& right, const KpVec3f& down)
{
    if (!volume.isPlaced)
        return {};
    KpMat4f image;
    image.setValue(right, down, right.cross(down), KpVec3f(0, 0, 0));
    return KpOrientationLetters(image);
}
