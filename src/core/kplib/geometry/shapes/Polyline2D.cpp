#include <kplib/geometry/shapes/Polyline2D.h>

#include <kplib/geometry/shapes/KpLine2D.h>

#include <algorithm>
#include <limits>
#include <typeinfo>

void Polyline2D::setVertices(std::vector<KpVec2f> vertices)
{
    changeVertices() = std::move(vertices);
}

void Polyline2D::append(KpVec2f v)
{
    changeVertices().push_back(v);
}

void Polyline2D::set(size_t i, const KpVec2f& v)
{
    changeVertices()[i] = v;
}

void Polyline2D::clear()
{
    changeVertices().clear();
}

void Polyline2D::offset(KpVec2f v)
{
    for (KpVec2f& vertex : changeVertices())
        vertex += v;
}

bool Polyline2D::isClosed() const
{
    return vertices_.size() >= 3 && vertices_.front() == vertices_.back();
}

bool Polyline2D::close()
{
    if (vertices_.size() < 3)
        return false;
    if (!isClosed())
        append(vertices_.front());
    return true;
}

std::pair<bool, KpVec2f> Polyline2D::closestPoint(KpVec2f p) const
{
    if (vertices_.empty())
        return {false, KpVec2f(0, 0)};
    KpVec2f best = vertices_.front();
    float least = std::numeric_limits<float>::max();
    for (size_t i = 1; i < vertices_.size(); ++i) {
        const KpLine2D segment(vertices_[i - 1], vertices_[i]);
        if (segment.isEmpty())
            continue;
        const KpVec2f point = segment.getClosestPoint(p, true);
        const float distance = (p - point).squaredLength();
        if (distance < least) {
            least = distance;
            best = point;
        }
    }
    return {true, best};
}

Rectangle2D Polyline2D::boundingBox() const
{
    if (isBoxValid_)
        return box_;
    KpVec2f low(0, 0), high(0, 0);
    if (!vertices_.empty())
        low = high = vertices_.front();
    for (const KpVec2f& v : vertices_) {
        for (int i = 0; i < 2; ++i) {
            low[i] = std::min(low[i], v[i]);
            high[i] = std::max(high[i], v[i]);
        }
    }
    box_ = Rectangle2D(low, high);
    isBoxValid_ = true;
    return box_;
}

bool Polyline2D::equals(const AbstractShape2D& other) const
{
    return typeid(*this) == typeid(other) && vertices_ == static_cast<const Polyline2D&>(other).vertices_;
}

double Polyline2D::length() const
{
    double sum = 0;
    for (size_t i = 1; i < vertices_.size(); ++i)
        sum += static_cast<double>((vertices_[i] - vertices_[i - 1]).hypot());
    return sum;
}

float Polyline2D::lengthOfSegment(size_t i) const
{
    const size_t pairs = vertices_.size() / 2;
    return i < pairs ? (vertices_[2 * i + 1] - vertices_[2 * i]).hypot() : 0;
}
