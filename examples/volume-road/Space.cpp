#include "Space.h"

#include <kplib/geometry/KpMat4f.h>

Space::Space(const std::string& frameUid, const Volume& volume) : patient(new KpFrameOfReference(frameUid))
{
    voxels = patient->createChildSystem();
    voxels->setOrigin(toVec(volume.origin));
    for (int i = 0; i < 3; ++i) {
        const auto axis = static_cast<size_t>(i);
        voxels->setAxis(i, toVec(volume.axes[axis]) * static_cast<float>(volume.spacing[axis]));
    }
}

KpOrientationLetters lettersOf(const Volume& volume, const KpVec3f& right, const KpVec3f& down)
{
    if (!volume.isPlaced)
        return {};
    KpMat4f image;
    image.setValue(right, down, right.cross(down), KpVec3f(0, 0, 0));
    return KpOrientationLetters(image);
}
