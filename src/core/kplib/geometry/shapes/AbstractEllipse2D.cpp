#include <kplib/geometry/shapes/AbstractEllipse2D.h>

#include <kplib/geometry/shapes/Rectangle2D.h>

#include <cmath>
#include <numbers>

namespace {

constexpr float pi = std::numbers::pi_v<float>, twoPi = 2 * pi;

float dividedUnlessZero(float value, float divisor)
{
    return divisor != 0 ? value / divisor : value;
}

}  // namespace

std::pair<bool, KpVec2f> AbstractEllipse2D::closestPoint(KpVec2f p) const
{
    const KpVec2f d = p - center_;
    const double x = static_cast<double>(dividedUnlessZero(d.x(), radiusX()));
    const double y = static_cast<double>(dividedUnlessZero(d.y(), radiusY()));
    return {true, projectPoint(static_cast<float>(std::atan2(y, x)))};
}

Rectangle2D AbstractEllipse2D::boundingBox() const
{
    return {center_ - radius(), center_ + radius()};
}

bool AbstractEllipse2D::isEmpty() const
{
    return radiusX() == 0 && radiusY() == 0;
}

std::vector<KpVec2f> AbstractEllipse2D::tesselate(unsigned int segments) const
{
    std::vector<KpVec2f> points;
    points.reserve(segments + 1UL);
    for (unsigned long i = 0; i <= segments; ++i)
        points.push_back(projectPoint(static_cast<float>(i) * twoPi / static_cast<float>(segments)));
    return points;
}

float AbstractEllipse2D::area() const
{
    return pi * radiusX() * radiusY();
}

float AbstractEllipse2D::circumference() const
{
    if (isEmpty())
        return 0;
    const float sum = radiusX() + radiusY(), difference = radiusX() - radiusY();
    const float h = difference * difference / (sum * sum);
    return pi * sum * (1 + 3 * h / (10 + std::sqrt(4 - 3 * h)));
}

KpVec2f AbstractEllipse2D::onOutline(float angle, float radiusX, float radiusY) const
{
    const auto a = static_cast<double>(angle);
    return center_ + KpVec2f(static_cast<float>(static_cast<double>(radiusX) * std::cos(a)),
                             static_cast<float>(static_cast<double>(radiusY) * std::sin(a)));
}
