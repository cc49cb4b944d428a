#include <kplib/geometry/KpSphere.h>

#include <kplib/geometry/KpLine.h>
#include <kplib/geometry/detail/NoResult.h>

#include <algorithm>
#include <cmath>

using kplib::detail::nanVector;

namespace {

// The parameters of both hits of the unbounded line, the nearer one first; false for a miss.
bool solve(const KpSphere& sphere, const KpLine& line, float& near, float& far)
{
    const KpVec3f fromCenter = line.position() - sphere.center();
    const float b = 2 * fromCenter.dot(line.direction());
    const float c = fromCenter.dot(fromCenter) - sphere.radius() * sphere.radius();
    const float discriminant = b * b - 4 * c;
    if (discriminant < 0)
        return false;
    const float root = std::sqrt(discriminant);
    near = (-b - root) / 2;
    far = (root - b) / 2;
    return true;
}

KpVec3f pointAt(const KpLine& line, float t)
{
    return line.position() + line.direction() * t;
}

}  // namespace

const KpSphere& KpSphere::emptySphere()
{
    // Intentional: created without a lock and never freed, since a holder may outlive the statics.
    static constinit const KpSphere* empty = nullptr;
    if (empty == nullptr)
        empty = new KpSphere(KpVec3f(0, 0, 0), -1);
    return *empty;
}

bool KpSphere::intersect(const KpLine& line, KpVec3f& out) const
{
    float near, far;
    if (!solve(*this, line, near, far))
        return false;
    const float t = near < 0 ? far : near;
    if (t < 0)
        return false;
    out = pointAt(line, t);
    return true;
}

bool KpSphere::intersect(const KpLine& line, KpVec3f& enter, KpVec3f& exit) const
{
    float near, far;
    if (!solve(*this, line, near, far)) {
        enter = exit = nanVector;
        return false;
    }
    enter = pointAt(line, near);
    exit = pointAt(line, far);
    return true;
}

bool KpSphere::intersect(const KpVec3f& p0, const KpVec3f& p1, KpVec3f& enter, KpVec3f& exit) const
{
    const KpLine line(p0, p1);
    float near, far;
    if (!solve(*this, line, near, far)) {
        enter = exit = nanVector;
        return false;
    }
    const float length = (p1 - p0).length();
    enter = pointAt(line, std::min(std::max(near, 0.0F), length));
    exit = pointAt(line, std::min(std::max(far, 0.0F), length));
    return true;
}
