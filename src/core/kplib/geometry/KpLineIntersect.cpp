#include <kplib/geometry/KpLine.h>

#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/detail/NoResult.h>

#include <algorithm>
#include <cmath>
#include <utility>

using kplib::detail::nanVector;

namespace {

constexpr float unbounded = 1e38F;
constexpr float least = 1e-10F;  // below it a length, a cosine or an edge counts as 0

// The parameters between which a line is inside all slabs tested so far.
struct Range {
    float entry = -unbounded;
    float exit = unbounded;
};

enum class Crossing { Apart, Thin, Through };

// Narrows `range` to the slab from `low` to `high` on one axis; a line parallel to it leaves the range.
Crossing crossSlab(float position, float direction, float low, float high, float tolerance, Range& range)
{
    if (std::abs(direction) > 1e-6F) {
        const float inverse = 1 / direction;
        float entry = (low - position) * inverse, exit = (high - position) * inverse;
        if (direction < 0)
            std::swap(entry, exit);
        if (tolerance > exit - entry)
            return Crossing::Thin;
        range = {std::max(range.entry, entry), std::min(range.exit, exit)};
        return Crossing::Through;
    }
    const bool isApart = low > position + tolerance || position - tolerance > high;
    return isApart ? Crossing::Apart : Crossing::Through;
}

// The two axes in which a triangle with this normal is seen largest.
std::pair<int, int> widestAxes(const KpVec3f& normal)
{
    const float x = std::abs(normal.x()), y = std::abs(normal.y()), z = std::abs(normal.z());
    if (x > y && x > z)
        return {1, 2};
    return y > z ? std::pair{2, 0} : std::pair{0, 1};
}

// The weights of b and c for the point a + g, with e = b - a and f = c - a; false if it lies outside. NaN is outside.
bool weights(const KpVec3f& normal, const KpVec3f& e, const KpVec3f& f, const KpVec3f& g, float& alpha, float& beta)
{
    const auto [u, v] = widestAxes(normal);
    beta = (e[u] * g[v] - e[v] * g[u]) / (e[u] * f[v] - e[v] * f[u]);
    if (!(beta >= 0 && beta <= 1))
        return false;
    alpha = std::abs(e[v]) > least ? (g[v] - f[v] * beta) / e[v] : (g[u] - f[u] * beta) / e[u];
    return alpha >= 0 && alpha + beta <= 1;
}

}  // namespace

bool KpLine::intersect(const KpBox3f& box, KpVec3f& enter, KpVec3f& exit, float tolerance) const
{
    Range range;
    bool isApart = box.isEmpty();
    for (int axis = 0; axis < 3 && !isApart; ++axis) {
        const Crossing crossing =
            crossSlab(position_[axis], direction_[axis], box[2 * axis], box[2 * axis + 1], tolerance, range);
        if (crossing == Crossing::Thin)
            return true;  // intentional: before a later axis can report a miss
        isApart = crossing == Crossing::Apart;
    }
    if (!isApart) {
        // An entry beyond the exit needs no test of its own: its points lie outside.
        const KpVec3f first = pointAt(range.entry), last = pointAt(range.exit);
        if (box.contains(first, tolerance) && box.contains(last, tolerance)) {
            enter = first;
            exit = last;
            return true;
        }
    }
    enter = exit = nanVector;
    return false;
}

bool KpLine::intersect(const KpVec3f& a, const KpVec3f& b, const KpVec3f& c, KpVec3f& hit, KpVec3f& barycentric,
                       bool& front) const
{
    front = false;
    KpVec3f normal = (c - b).cross(b - a);
    const float length = normal.normalize();
    const float slope = direction_.dot(normal);
    if (!(length < least) && !(std::abs(slope) < least)) {
        const KpVec3f point = pointAt((a - position_).dot(normal) / slope);
        float alpha, beta;
        if (weights(normal, b - a, c - a, point - a, alpha, beta)) {
            front = slope < 0;
            hit = point;
            barycentric = KpVec3f(1 - alpha - beta, alpha, beta);
            return true;
        }
    }
    hit = barycentric = nanVector;
    return false;
}
