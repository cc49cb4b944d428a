#include <kplib/geometry/KpViewVolume.h>

// Face `i`, from 0 to 5, relative to the eye and with its normal inward.
KpPlane KpViewVolume::face(int i) const
{
    const KpVec3f &a = llfO_, &b = lrfO_, &c = ulfO_, eye(0, 0, 0);
    const KpVec3f d = c - a + b, toFar = projDir_ * nearToFar_;
    const bool isBox = type_ == Orthographic;
    switch (i) {
    case 0:
        return isBox ? KpPlane(b - a, a) : KpPlane(eye, a, c);
    case 1:
        return isBox ? KpPlane(a - b, b) : KpPlane(eye, d, b);
    case 2:
        return KpPlane(b, a, c);
    case 3:
        return KpPlane(c + toFar, a + toFar, b + toFar);
    case 4:
        return isBox ? KpPlane(c - a, a) : KpPlane(eye, b, a);
    default:
        return isBox ? KpPlane(a - c, c) : KpPlane(eye, c, d);
    }
}

bool KpViewVolume::intersect(const KpVec3f& point) const
{
    if (nearDist_ == 0 && nearToFar_ == 0)
        return false;
    const KpVec3f relative = point - projPoint_;
    for (int i = 0; i < 6; ++i) {
        if (!face(i).isInHalfSpace(relative))
            return false;
    }
    return true;
}

bool KpViewVolume::intersect(const KpVec3f& p0, const KpVec3f& p1, KpVec3f& out) const
{
    const KpVec3f middle = projPoint_ + llfO_ + (width() + height()) / 2;
    const KpLine central(type_ == Perspective ? projPoint_ : middle - projDir_ * nearToFar_, middle);
    KpVec3f closest, onCentral;
    const bool isFound = KpLine(p0, p1).getClosestPoints(central, closest, onCentral);
    const bool isInSegment = (p1 - p0).dot(closest - p0) >= 0 && (p0 - p1).dot(closest - p1) >= 0;
    out = closest;
    return isFound && isInSegment && intersect(closest);
}

bool KpViewVolume::intersect(const KpBox3f& box) const
{
    if (box.isEmpty())
        return false;
    const KpVec3f min = box.min() - projPoint_, max = box.max() - projPoint_;
    for (int i = 0; i < 6; ++i) {
        if (outsideTest(face(i), min, max))
            return false;
    }
    return true;
}

bool KpViewVolume::outsideTest(const KpPlane& plane, const KpVec3f& min, const KpVec3f& max)
{
    KpVec3f furthest = min;
    for (int axis = 0; axis < 3; ++axis) {
        if (plane.normal()[axis] > 0)
            furthest[axis] = max[axis];
    }
    return plane.normal().dot(furthest) - plane.distance() < 0;
}
