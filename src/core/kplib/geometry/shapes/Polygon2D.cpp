#include <kplib/geometry/shapes/Polygon2D.h>

#include <algorithm>

namespace {

// Whether the ray from `p` toward greater x crosses the edge. No `p` passes the first test for a horizontal edge.
bool crosses(const KpVec2f& p, const KpVec2f& a, const KpVec2f& b)
{
    if (!(p.y() > std::min(a.y(), b.y()) && p.y() <= std::max(a.y(), b.y()) && p.x() <= std::max(a.x(), b.x())))
        return false;
    return a.x() == b.x() || (p.y() - a.y()) * (b.x() - a.x()) / (b.y() - a.y()) + a.x() >= p.x();
}

}  // namespace

void Polygon2D::setVertices(std::vector<KpVec2f> vertices)
{
    if (!vertices.empty() && !(vertices.size() > 1 && vertices.front() == vertices.back()))
        vertices.push_back(KpVec2f(vertices.front()));
    Polyline2D::setVertices(std::move(vertices));
}

void Polygon2D::append(KpVec2f v)
{
    if (isEmpty()) {
        setVertices({v});
        return;
    }
    std::vector<KpVec2f>& vertices = changeVertices();
    vertices.back() = v;
    vertices.push_back(KpVec2f(vertices.front()));
}

bool Polygon2D::contains(const KpVec2f& p) const
{
    bool isInside = false;
    for (size_t i = 0; i < size(); ++i) {
        if (crosses(p, at(i == 0 ? size() - 1 : i - 1), at(i)))
            isInside = !isInside;
    }
    return isInside;
}

std::pair<bool, KpVec2f> Polygon2D::closestPoint(KpVec2f p) const
{
    return contains(p) ? std::make_pair(true, p) : Polyline2D::closestPoint(p);
}
