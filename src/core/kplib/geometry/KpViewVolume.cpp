#include <kplib/geometry/KpViewVolume.h>

#include <cmath>

namespace {

KpMat4f translation(const KpVec3f& by)
{
    KpMat4f matrix;
    matrix.setTranslate(by);
    return matrix;
}

}  // namespace

void KpViewVolume::ortho(float left, float right, float bottom, float top, float near, float far)
{
    setShape(Orthographic, {left, bottom, -near}, {right, bottom, -near}, {left, top, -near}, near, far);
}

void KpViewVolume::perspective(float fovy, float aspect, float near, float far)
{
    const float h = static_cast<float>(static_cast<double>(near) * std::tan(static_cast<double>(fovy) / 2));
    const float w = h * aspect;
    setShape(Perspective, {-w, -h, -near}, {w, -h, -near}, {-w, h, -near}, near, far);
}

void KpViewVolume::frustum(float left, float right, float bottom, float top, float near, float far)
{
    setShape(Perspective, {left, bottom, near}, {right, bottom, near}, {left, top, near}, near, far);
}

void KpViewVolume::setShape(Type type, const KpVec3f& llf, const KpVec3f& lrf, const KpVec3f& ulf, float near,
                            float far)
{
    type_ = type;
    projPoint_ = KpVec3f(0, 0, 0);
    projDir_ = KpVec3f(0, 0, -1);
    nearDist_ = near;
    nearToFar_ = far - near;
    llfO_ = llf;
    lrfO_ = lrf;
    ulfO_ = ulf;
    rebuildCorners();
}

void KpViewVolume::rebuildCorners()
{
    llf_ = projPoint_ + llfO_;
    lrf_ = projPoint_ + lrfO_;
    ulf_ = projPoint_ + ulfO_;
}

void KpViewVolume::setCameraOffset(float offset)
{
    cameraOffset_ = offset;
    cameraOffsetIsSet_ = 1;
}

void KpViewVolume::unsetCameraOffset()
{
    cameraOffset_ = 0;
    cameraOffsetIsSet_ = 0;
}

void KpViewVolume::getMatrices(KpMat4f& affine, KpMat4f& proj) const
{
    const KpVec3f right = width() / width().length();
    const KpVec3f up = height() / height().length();
    KpMat4f axes;
    axes.setValue(right, up, -projDir_, KpVec3f(0, 0, 0));
    const KpMat4f toCamera = axes.inverse();
    affine = translation(-llf_) * toCamera;
    affine *= translation(-affine.multVecMatrix(projPoint_));

    const KpVec3f ll = toCamera.multVecMatrix(llfO_);
    const KpVec3f lr = toCamera.multVecMatrix(lrfO_);
    const KpVec3f ul = toCamera.multVecMatrix(ulfO_);
    const float w = lr.x() - ll.x(), p = lr.x() + ll.x();
    const float h = ul.y() - ll.y(), q = ul.y() + ll.y();
    const float far = nearDist_ + nearToFar_;
    const float s = nearDist_ + far;

    proj.makeIdentity();
    if (type_ == Orthographic) {
        proj[0][0] = 2 / w;
        proj[1][1] = 2 / h;
        proj[2][2] = -2 / nearToFar_;
        proj[3][0] = -p / w;
        proj[3][1] = -q / h;
        proj[3][2] = -s / nearToFar_;
        return;
    }
    proj[0][0] = 2 * nearDist_ / w;
    proj[1][1] = 2 * nearDist_ / h;
    proj[2][0] = (p + stereoShift(w)) / w;
    proj[2][1] = q / h;
    proj[2][2] = -s / nearToFar_;
    proj[2][3] = -1;
    proj[3][2] = -2 * nearDist_ * far / nearToFar_;
    proj[3][3] = 0;
}

// How far the near rectangle, `width` wide, moves for an eye that stands beside the middle, so that the two images meet
// halfway between near and far.
float KpViewVolume::stereoShift(float width) const
{
    if (stereoMode_ == 0)
        return 0;
    const auto near = static_cast<double>(nearDist_), middle = near + static_cast<double>(nearToFar_) / 2;
    auto offset = static_cast<double>(cameraOffset_);
    if (!isCameraOffsetSet()) {
        offset = static_cast<double>(width) * (middle / near) * 0.035 * static_cast<double>(stereoEyeScale_);
        if (stereoMode_ == 1)
            offset = -offset;
    }
    return static_cast<float>(offset * static_cast<double>(stereoOffsetScale_) * (near / middle) * -2);
}

KpMat4f KpViewVolume::getMatrix() const
{
    KpMat4f affine, proj;
    getMatrices(affine, proj);
    return affine * proj;
}

KpMat4f KpViewVolume::getCameraSpaceMatrix() const
{
    KpMat4f turn;
    turn.setRotate(KpRotation(projDir_, KpVec3f(0, 0, -1)));
    return translation(-projPoint_) * turn;
}
