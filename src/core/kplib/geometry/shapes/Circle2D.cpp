#include <kplib/geometry/shapes/Circle2D.h>

#include <typeinfo>

bool Circle2D::equals(const AbstractShape2D& other) const
{
    if (typeid(*this) != typeid(other))
        return false;
    const auto& circle = static_cast<const Circle2D&>(other);
    return center() == circle.center() && radius_ == circle.radius_;
}
