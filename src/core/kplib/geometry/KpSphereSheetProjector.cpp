#include <kplib/geometry/KpSphereSheetProjector.h>

#include <cmath>

KpVec3f KpSphereSheetProjector::project(const KpVec2f& point)
{
    const KpLine line = getWorkingLine(point);
    if (needSetup_)
        setupPlane(nullptr);
    KpVec3f onPlane;
    if (!meetsSphere(line, lastPoint_, onPlane))
        lastPoint_ = onSheet(onPlane, sheetDirection(onPlane));
    return lastPoint_;
}

KpVec3f KpSphereSheetProjector::intersect(const KpLine& worldLine)
{
    const KpLine line = toWorkingSpace(worldLine);
    if (needSetup_)
        setupPlane(&line);
    KpVec3f onPlane;
    if (!meetsSphere(line, lastPoint_, onPlane))
        lastPoint_ = onSheet(onPlane, intersectFront_ ? -line.direction() : line.direction());
    return lastPoint_;
}

KpSphereSheetProjector* KpSphereSheetProjector::copy() const
{
    return new KpSphereSheetProjector(*this);
}

KpRotation KpSphereSheetProjector::getRotation(const KpVec3f& from, const KpVec3f& to)
{
    const float halfChord = (to - from).length() / (2 * sphere_.radius());
    if (static_cast<double>(halfChord) < 1e-6 || halfChord > 1)
        return KpRotation::identity();
    KpVec3f axis = (from - planePoint_).cross(to - planePoint_);
    axis.normalize();
    return KpRotation(axis, 2 * static_cast<float>(std::asin(static_cast<double>(halfChord))));
}

void KpSphereSheetProjector::setupPlane(const KpLine* line)
{
    if (!orientToEye_) {
        planeDir_ = KpVec3f(0, 0, 1);
    } else if (line) {
        planeDir_ = -line->direction();
    } else if (viewVolume().type() == KpViewVolume::Orthographic) {
        planeDir_ = towardViewer();
        planeDir_.normalize();
    } else {
        planeEye_ = eye();
        planeDir_ = planeEye_ - sphere_.center();
        planeDir_.normalize();
    }
    if (!intersectFront_)
        planeDir_ = -planeDir_;
    planeDist_ = 0;
    planePoint_ = sphere_.center();
    tolPlane_ = KpPlane(planeDir_, planePoint_);
    needSetup_ = false;
}

// Whether the line meets the part of the sphere that is in use, of 45 degrees about planeDir(). `onPlane` is below the
// point of the whole sphere or, for a line that misses it, where that line meets the plane.
bool KpSphereSheetProjector::meetsSphere(const KpLine& line, KpVec3f& onSphere, KpVec3f& onPlane) const
{
    KpVec3f enter, exit;
    KpLine toPlane = line;
    if (sphere_.intersect(line, enter, exit))
        toPlane.setPosDir(intersectFront_ ? enter : exit, planeDir_);
    onSphere = intersectFront_ ? enter : exit;
    tolPlane_.intersect(toPlane, onPlane);
    return static_cast<float>(static_cast<double>(sphere_.radius()) * 0.7071067811865476) >
           (onPlane - planePoint_).length();
}

// The height r^2 / (2 d) and its slope are the sphere's where they meet.
KpVec3f KpSphereSheetProjector::onSheet(const KpVec3f& onPlane, const KpVec3f& direction) const
{
    const float radius = sphere_.radius();
    const float height = radius * radius * 0.5F / (onPlane - planePoint_).length();
    return onPlane + direction * height;
}

KpVec3f KpSphereSheetProjector::sheetDirection(const KpVec3f& onPlane) const
{
    KpVec3f direction(0, 0, 1);
    if (orientToEye_) {
        const bool isBox = viewVolume().type() == KpViewVolume::Orthographic;
        direction = isBox ? towardViewer() : planeEye_ - onPlane;
        direction.normalize();
    }
    return intersectFront_ ? direction : -direction;
}
