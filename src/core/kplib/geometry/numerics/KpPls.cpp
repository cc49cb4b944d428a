#include <kplib/geometry/numerics/KpPls.h>

#include <kplib/foundation/KpDArray.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/shapes/KpLine2D.h>
#include <kplib/volume/KpBitfield.h>

#include <cmath>
#include <utility>
#include <vector>

namespace {

using Points = KpDArray<KpVec2f>;

KpBitfield noMarks(const Points& points)
{
    return {static_cast<unsigned long>(points.size()), KpBitfield::INIT_UNSET};
}

// The point strictly between that is farthest from the line, the first of equal ones, and its distance.
std::pair<long, float> farthest(const Points& points, const KpLine2D& line, long first, long last)
{
    std::pair<long, float> best{first, -1.0F};
    for (long i = first + 1; i < last; ++i) {
        const float distance = std::abs(line.getDistanceTo(points[i]));
        if (distance > best.second)
            best = {i, distance};
    }
    return best;
}

long farthestFromFirst(const Points& points)
{
    long best = 0;
    float most = 0;
    for (long i = 1; i < points.size(); ++i) {
        const float distance = (points[i] - points[0]).squaredLength();
        if (distance > most) {
            most = distance;
            best = i;
        }
    }
    return best;
}

}  // namespace

void KpPls::DouglasPeucker(const Points& points, float tolerance, Points& result)
{
    KpBitfield marks = noMarks(points);
    if (points.size() > 0)
        DouglasPeuckerImpl(points, marks, 0, points.size() - 1, tolerance);
    extractMarkedPoints(points, marks, result);
}

void KpPls::DouglasPeuckerInLoop(const Points& points, float tolerance, Points& result)
{
    KpBitfield marks = noMarks(points);
    if (points.size() > 0) {
        const long turn = farthestFromFirst(points);
        DouglasPeuckerImpl(points, marks, 0, turn, tolerance);
        DouglasPeuckerImpl(points, marks, turn, points.size() - 1, tolerance);
    }
    extractMarkedPoints(points, marks, result);
}

// A stack of stretches replaces the recursion, whose depth for a spiral would be its number of
// points.
void KpPls::DouglasPeuckerImpl(const Points& points, KpBitfield& marks, long first, long last, float tolerance)
{
    std::vector<std::pair<long, long>> stretches{{first, last}};
    while (!stretches.empty()) {
        const auto [from, to] = stretches.back();
        stretches.pop_back();
        const KpLine2D line(points[from], points[to]);
        if (from == to || line.isEmpty())
            continue;
        marks.set(static_cast<unsigned long>(from));
        marks.set(static_cast<unsigned long>(to));
        const auto [middle, distance] = farthest(points, line, from, to);
        if (middle != from && distance > tolerance) {
            stretches.emplace_back(from, middle);
            stretches.emplace_back(middle, to);
        }
    }
}

void KpPls::extractMarkedPoints(const Points& points, const KpBitfield& marks, Points& result)
{
    Points kept;
    for (long i = 0; i < points.size(); ++i) {
        if (marks.test(static_cast<unsigned long>(i)))
            kept.append(points[i]);
    }
    result.swap(kept);
}

void KpPls::ReumannWitkam(const Points& points, float tolerance, Points& result)
{
    const long n = points.size();
    if (n <= 2) {
        result = points;
        return;
    }
    const float squaredTolerance = tolerance * tolerance;
    Points kept;
    kept.append(points[0]);
    long anchor = 0, cursor = 1;
    while (cursor < n) {
        // A piece shorter than the tolerance has no reliable direction.
        while (cursor < n - 1 && (points[cursor] - points[anchor]).squaredLength() < squaredTolerance)
            ++cursor;
        const KpLine2D strip(points[anchor], points[cursor]);
        ++cursor;
        while (cursor < n && strip.getDistance2To(points[cursor]) < squaredTolerance)
            ++cursor;
        anchor = cursor - 1;
        kept.append(points[anchor]);
    }
    result.swap(kept);
}

void KpPls::ReumannWitkam(Points& points, float tolerance)
{
    ReumannWitkam(points, tolerance, points);
}
