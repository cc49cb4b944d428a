#include <kplib/geometry/KpPlane.h>

#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpLine.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpVec4f.h>
#include <kplib/geometry/detail/NoResult.h>

#include <algorithm>
#include <cmath>
#include <optional>

using kplib::detail::nanVector;

namespace {

constexpr float cosineTolerance = 0.0001F;

// The cosine of the angle between two directions of any length; nothing if one is too short.
std::optional<float> cosine(KpVec3f a, KpVec3f b)
{
    constexpr float shortest = 1e-6F;
    const float lengthA = a.normalize(), lengthB = b.normalize();
    if (lengthA < shortest || lengthB < shortest)
        return std::nullopt;
    return a.dot(b);
}

// NaN passes, here and in the comparison of distances: values that cannot be compared are equal.
bool isNearOne(float cosine)
{
    return !(cosine - cosineTolerance > 1) && !(cosine + cosineTolerance < 1);
}

}  // namespace

const KpPlane& KpPlane::emptyPlane()
{
    static const KpPlane empty(KpVec3f(0, 0, 0), 0.0F);
    return empty;
}

// Gives the former length; 0 has made all four numbers 0, also where it is that of a tiny normal.
float KpPlane::setUnitNormal(const KpVec3f& normal)
{
    normal_ = normal;
    const float length = normal_.normalize();
    if (length == 0) {
        normal_ = KpVec3f(0, 0, 0);
        distance_ = 0;
    }
    return length;
}

void KpPlane::flip()
{
    normal_ = -normal_;
    distance_ = -distance_;
}

void KpPlane::set(const KpVec3f& p0, const KpVec3f& p1, const KpVec3f& p2)
{
    set((p1 - p0).cross(p2 - p0), p0);
}

void KpPlane::set(const KpVec3f& normal, float distance)
{
    if (setUnitNormal(normal) != 0)
        distance_ = distance;
}

void KpPlane::set(const KpVec3f& normal, const KpVec3f& point)
{
    const KpVec3f through = point;  // may be this plane's normal
    if (setUnitNormal(normal) != 0)
        distance_ = normal_.dot(through);
}

void KpPlane::normalize()
{
    normal_.normalize();
    if (distance_ < 0)
        flip();
}

void KpPlane::transform(const KpMat4f& matrix)
{
    const KpVec3f foot = normal_ * distance_;
    if (setUnitNormal(matrix.multDirMatrix(normal_)) != 0)
        distance_ = matrix.multVecMatrix(foot).dot(normal_);
}

void KpPlane::transformInv(const KpMat4f& matrix)
{
    const KpVec4f moved = matrix.multMatrixVec(KpVec4f(normal_, -distance_));
    const float length = setUnitNormal(KpVec3f(moved.x(), moved.y(), moved.z()));
    if (length != 0)
        distance_ = -moved.w() / length;
}

bool KpPlane::isEmpty() const
{
    const float squared = normal_.squaredLength();
    return std::isnan(distance_) || !(squared >= 0.999F && squared <= 1.001F);
}

bool KpPlane::isInHalfSpace(const KpVec3f& point) const
{
    return normal_.dot(point) >= distance_;
}

KpVec3f KpPlane::getProjectedPoint(const KpVec3f& point) const
{
    return point - normal_ * (normal_.dot(point) - distance_);
}

bool KpPlane::intersect(const KpLine& line, KpVec3f& out, float* t) const
{
    const float slope = normal_.dot(line.direction());
    if (slope == 0) {
        out = nanVector;
        return false;
    }
    const float s = -(normal_.dot(line.position()) - distance_) / slope;
    out = line.position() + line.direction() * s;
    if (t != nullptr)
        *t = s;
    return true;
}

bool KpPlane::intersect(const KpPlane& other, KpLine& line) const
{
    const KpVec3f& n1 = normal_;
    const KpVec3f& n2 = other.normal_;
    const KpVec3f direction = n1.cross(n2);
    const float length = direction.length();
    if (length < 1e-5F) {
        line.setPosDir(nanVector, nanVector);
        return false;
    }
    // The line meets the coordinate plane that it stands up from most; the other two coordinates by Cramer's rule.
    const float x = std::abs(direction.x()), y = std::abs(direction.y()), z = std::abs(direction.z());
    const int zero = z > std::max(x, y) ? 2 : y > x ? 1 : 0;
    const int u = (zero + 1) % 3, v = (zero + 2) % 3;
    KpVec3f point(0, 0, 0);
    point[u] = (n2[v] * distance_ - n1[v] * other.distance_) / direction[zero];
    point[v] = (n1[u] * other.distance_ - n2[u] * distance_) / direction[zero];
    line.setPosDir(point, direction / length);
    return true;
}

void KpPlane::getDistance(const KpBox3f& box, float& min, float& max) const
{
    float least = normal_.dot(box.corner(0)) - distance_, greatest = least;
    for (int i = 1; i < 8; ++i) {
        const float distance = normal_.dot(box.corner(i)) - distance_;
        least = std::min(least, distance);
        greatest = std::max(greatest, distance);
    }
    min = least;
    max = greatest;
}

std::pair<bool, float> KpPlane::getDistance(const KpPlane& other) const
{
    if (!isParallel(other))
        return {false, 0.0F};
    return {true, normal_.dot(other.normal_ * other.distance_) - distance_};
}

bool KpPlane::isParallel(const KpPlane& other) const
{
    const auto cosine = static_cast<double>(normal_.dot(other.normal_));
    return std::abs(std::abs(cosine) - 1) <= 0.0001;
}

bool KpPlane::isNearEqualNormal(const KpVec3f& normal, bool orientationMatters) const
{
    const std::optional<float> c = cosine(normal_, normal);
    return c && isNearOne(orientationMatters ? *c : std::abs(*c));
}

bool KpPlane::isNearEqualInROI(const KpPlane& other, const KpVec3f& /*point*/, float /*extent*/, float tolerance,
                               bool orientationMatters) const
{
    const std::optional<float> c = cosine(normal_, other.normal_);
    if (!c || !isNearOne(orientationMatters ? *c : std::abs(*c)))
        return false;
    const float distance = *c < 0 ? -distance_ : distance_;
    return !(distance - tolerance > other.distance_) && !(other.distance_ > distance + tolerance);
}

std::string KpPlane::dump() const
{
    return R"({"normal":)" + normal_.dump() + R"(,"distance":")" + std::to_string(distance_) + R"("})";
}
