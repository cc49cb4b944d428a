#include <kplib/geometry/KpSphereProjector.h>

void KpSphereProjector::setWorkingSpace(const KpMat4f& workingToWorld)
{
    KpProjector::setWorkingSpace(workingToWorld);
    needSetup_ = true;
}

void KpSphereProjector::setSphere(const KpSphere& sphere)
{
    sphere_ = sphere;
    needSetup_ = true;
}

void KpSphereProjector::setFront(bool intersectFront)
{
    intersectFront_ = intersectFront;
    needSetup_ = true;
}

void KpSphereProjector::setOrientToEye(bool orientToEye)
{
    if (orientToEye == orientToEye_)
        return;
    orientToEye_ = orientToEye;
    needSetup_ = true;
}

KpVec3f KpSphereProjector::eye() const
{
    return worldToWorking().multVecMatrix(viewVolume().projPoint());
}

KpVec3f KpSphereProjector::towardViewer() const
{
    return worldToWorking().multDirMatrix(viewVolume().zVector());
}

bool KpSphereProjector::isPointInFront(const KpVec3f& point) const
{
    const bool isBox = viewVolume().type() == KpViewVolume::Orthographic;
    const KpVec3f front = isBox ? towardViewer() : eye() - sphere_.center();
    return !((point - sphere_.center()).dot(front) < 0);
}

KpVec3f KpSphereProjector::projectAndGetRotation(const KpVec2f& point, KpRotation& rotation)
{
    const KpVec3f before = lastPoint_;
    const KpVec3f now = project(point);
    rotation = getRotation(before, now);
    return now;
}
