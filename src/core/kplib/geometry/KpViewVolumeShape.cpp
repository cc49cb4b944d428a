#include <kplib/geometry/KpViewVolume.h>

#include <algorithm>
#include <cmath>
#include <initializer_list>
#include <utility>

void KpViewVolume::translateCamera(const KpVec3f& translation)
{
    const KpVec3f step = translation;  // may be one of those that move
    for (KpVec3f* point : {&projPoint_, &llf_, &lrf_, &ulf_})
        *point += step;
}

void KpViewVolume::rotateCamera(const KpRotation& rotation)
{
    KpMat4f turn;
    turn.setRotate(rotation);
    for (KpVec3f* direction : {&projDir_, &llfO_, &lrfO_, &ulfO_})
        turn.multDirMatrix(*direction, *direction);
    rebuildCorners();
}

void KpViewVolume::moveSidesIn(const KpVec3f& step)
{
    llfO_ += step;
    ulfO_ += step;
    lrfO_ -= step;
    rebuildCorners();
}

void KpViewVolume::moveBottomAndTopIn(const KpVec3f& step)
{
    llfO_ += step;
    lrfO_ += step;
    ulfO_ -= step;
    rebuildCorners();
}

void KpViewVolume::scaleWidth(float factor)
{
    moveSidesIn(width() * ((1 - std::abs(factor)) / 2));
}

void KpViewVolume::scaleHeight(float factor)
{
    moveBottomAndTopIn(height() * ((1 - std::abs(factor)) / 2));
}

void KpViewVolume::scale(float factor)
{
    const float share = (1 - std::abs(factor)) / 2;
    const KpVec3f u = width() * share, v = height() * share;
    moveSidesIn(u);
    moveBottomAndTopIn(v);
}

void KpViewVolume::transform(const KpMat4f& matrix)
{
    const KpViewVolume old = std::exchange(*this, KpViewVolume());
    type_ = old.type_;
    projPoint_ = matrix.multVecMatrix(old.projPoint_);
    projDir_ = matrix.multDirMatrix(old.projDir_);
    projDir_.normalize();
    const auto fromEye = [&](const KpVec3f& oldCorner) {
        return matrix.multVecMatrix(old.projPoint_ + oldCorner) - projPoint_;
    };
    llfO_ = fromEye(old.llfO_);
    lrfO_ = fromEye(old.lrfO_);
    ulfO_ = fromEye(old.ulfO_);

    const auto distance = [&](float oldDistance) {
        return (matrix.multVecMatrix(old.getSightPoint(oldDistance)) - projPoint_).length();
    };
    nearDist_ = distance(old.nearDist_);
    if (old.nearDist_ < 0)
        nearDist_ = -nearDist_;
    nearToFar_ = distance(old.nearDist_ + old.nearToFar_) - nearDist_;

    if (width().cross(height()).dot(projDir_) >= 0) {  // a mirror
        ulfO_ = lrfO_ + height();
        std::swap(llfO_, lrfO_);
    }
    rebuildCorners();
}

KpViewVolume KpViewVolume::narrow(float left, float bottom, float right, float top) const
{
    const KpVec3f u = width(), v = height();
    KpViewVolume result = *this;
    result.llfO_ = llfO_ + u * left + v * bottom;
    result.lrfO_ = llfO_ + u * right + v * bottom;
    result.ulfO_ = llfO_ + u * left + v * top;
    result.rebuildCorners();
    return result;
}

KpViewVolume KpViewVolume::zNarrow(float near, float far) const
{
    near = std::min(near, 1.0F);
    far = std::max(far, 0.0F);
    KpViewVolume result;
    result.type_ = type_;
    result.projPoint_ = projPoint_;
    result.projDir_ = projDir_;
    result.nearDist_ = near;
    result.nearToFar_ = (near - far) * nearToFar_;

    KpPlane plane(zVector(), llfO_);
    plane.offset((near - 1) * nearToFar_);
    const auto moveToPlane = [&](const KpVec3f& corner, KpVec3f& moved) {
        KpLine line(KpVec3f(0, 0, 0), corner);
        if (type_ == Orthographic)
            line.setPosDir(corner, projDir_);
        plane.intersect(line, moved);
    };
    moveToPlane(llfO_, result.llfO_);
    moveToPlane(lrfO_, result.lrfO_);
    moveToPlane(ulfO_, result.ulfO_);
    result.rebuildCorners();
    return result;
}

KpViewVolume KpViewVolume::narrow(const KpBox3f& box) const
{
    return narrow(box.xmin(), box.ymin(), box.xmax(), box.ymax()).zNarrow(box.zmax(), box.zmin());
}
