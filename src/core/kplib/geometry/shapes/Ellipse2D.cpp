#include <kplib/geometry/shapes/Ellipse2D.h>

#include <cmath>
#include <typeinfo>

Ellipse2D Ellipse2D::span(const KpVec2f& a, const KpVec2f& b)
{
    Ellipse2D ellipse;
    ellipse.spanX(a, b);
    ellipse.spanY(a, b);
    return ellipse;
}

Ellipse2D Ellipse2D::spanInner(const KpVec2f& a, const KpVec2f& b)
{
    constexpr float sqrt2 = 1.4142135F;
    Ellipse2D ellipse = span(a, b);
    ellipse.radiusX_ *= sqrt2;
    ellipse.radiusY_ *= sqrt2;
    return ellipse;
}

void Ellipse2D::spanX(const KpVec2f& a, const KpVec2f& b)
{
    setCenter({(a.x() + b.x()) / 2, center().y()});
    radiusX_ = std::abs(b.x() - a.x()) / 2;
}

void Ellipse2D::spanY(const KpVec2f& a, const KpVec2f& b)
{
    setCenter({center().x(), (a.y() + b.y()) / 2});
    radiusY_ = std::abs(b.y() - a.y()) / 2;
}

void Ellipse2D::setRadius(const KpVec2f& radii)
{
    radiusX_ = radii.x();
    radiusY_ = radii.y();
}

bool Ellipse2D::equals(const AbstractShape2D& other) const
{
    if (typeid(*this) != typeid(other))
        return false;
    const auto& ellipse = static_cast<const Ellipse2D&>(other);
    return center() == ellipse.center() && radiusX_ == ellipse.radiusX_ && radiusY_ == ellipse.radiusY_;
}
