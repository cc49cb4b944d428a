#include <kplib/geometry/shapes/Angle2D.h>

void Angle2D::setVertices(std::vector<KpVec2f> vertices)
{
    if (vertices.size() == 3)
        Polyline2D::setVertices(std::move(vertices));
}

void Angle2D::append(KpVec2f v)
{
    if (size() < 3)
        Polyline2D::append(v);
}

bool Angle2D::isValid() const
{
    constexpr float shortest = 0.001F;  // squared
    return !isEmpty() && arm(0).squaredLength() >= shortest && arm(2).squaredLength() >= shortest;
}

std::pair<bool, float> Angle2D::angle() const
{
    if (!isValid())
        return {false, 0.0F};
    return {true, at(0) == at(2) ? 0 : arm(0).angle(arm(2))};
}
