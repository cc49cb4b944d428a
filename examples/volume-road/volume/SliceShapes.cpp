#include "SliceShapes.h"

#include <kplib/geometry/numerics/KpPls.h>

#include <algorithm>
#include <cmath>
#include <utility>
#include <vector>

namespace {

constexpr int rays = 360;
constexpr float tolerance = 1;  // mm

/// The outermost points of the outline as seen from its middle, a ray a degree.
std::vector<KpVec2f> outermost(const MiddleSlice& slice)
{
    std::vector<KpVec2f> found;
    for (long y = 0; y < slice.height(); ++y) {
        for (long x = 0; x < slice.width(); ++x) {
            if (slice.isOutline(x, y))
                found.push_back(slice.at(x, y));
        }
    }
    if (found.empty())
        return found;
    const KpVec2f middle = Polyline2D(found).boundingBox().center();
    std::array<float, rays> farthest{};
    std::array<KpVec2f, rays> points{};
    for (const KpVec2f& p : found) {
        const KpVec2f d = p - middle;
        const double turn = std::atan2(static_cast<double>(d.y()), static_cast<double>(d.x())) / (2 * M_PI) + 0.5;
        const auto ray = static_cast<size_t>(std::min(turn * rays, rays - 1.0));
        if (d.length() > farthest[ray]) {
            farthest[ray] = d.length();
            points[ray] = p;
        }
    }
    std::vector<KpVec2f> outline;
    for (size_t i = 0; i < rays; ++i) {
        if (farthest[i] > 0)
            outline.push_back(points[i]);
    }
    return outline;
}

}  // namespace

bool MiddleSlice::isOutline(long x, long y) const
{
    const auto voxel = static_cast<unsigned long>(first() + y * volume_.dims[0] + x);
    return voxel < outline_.nBits() && outline_.test(voxel);
}

KpVec2f MiddleSlice::at(long x, long y) const
{
    return {static_cast<float>(static_cast<double>(x) * volume_.spacing[0]),
            static_cast<float>(static_cast<double>(y) * volume_.spacing[1])};
}

std::array<unsigned char, 3> MiddleSlice::colour(const KpVec2f& place) const
{
    const auto index = [&](int axis) {
        const long i = std::lround(static_cast<double>(place[axis]) / volume_.spacing[axis]);
        return std::clamp(i, 0L, volume_.dims[static_cast<size_t>(axis)] - 1);
    };
    const unsigned char* const voxel =
        volume_.bytes.data() + (first() + index(1) * volume_.dims[0] + index(0)) * volume_.components;
    return volume_.components == 3 ? std::array{voxel[0], voxel[1], voxel[2]} : std::array{*voxel, *voxel, *voxel};
}

SliceShapes shapesOf(const MiddleSlice& slice)
{
    SliceShapes shapes;
    shapes.outline.setVertices(outermost(slice));
    KpDArray<KpVec2f> points, kept;
    for (const KpVec2f& p : shapes.outline)
        points.append(p);
    KpPls::DouglasPeuckerInLoop(points, tolerance, kept);
    shapes.simplified.setVertices({kept.begin(), kept.end()});
    const Rectangle2D box = shapes.outline.boundingBox();
    shapes.ellipse = Ellipse2D::span(box.getUpperLeft(), box.getLowerRight());
    const KpVec2f middle = box.center();
    shapes.angle.setVertices({shapes.outline.closestPoint(box.getUpperLeft()).second, middle,
                              shapes.outline.closestPoint({box.getLowerRight().x(), box.getUpperLeft().y()}).second});
    return shapes;
}

double areaOf(const Polygon2D& polygon)
{
    double twice = 0;
    for (size_t i = 1; i < polygon.size(); ++i) {
        const KpVec2f &a = polygon.at(i - 1), &b = polygon.at(i);
        twice += static_cast<double>(a.x()) * static_cast<double>(b.y()) -
                 static_cast<double>(b.x()) * static_cast<double>(a.y());
    }
    return std::abs(twice) / 2;
}
