#pragma once

#include <kplib/geometry/shapes/Polyline2D.h>

#include <utility>
#include <vector>

/// A filled polygon: a closed list of vertices, whose last vertex equals the first. It may cross
/// itself; the even-odd rule defines its interior.
class KPLIB_API Polygon2D : public Polyline2D {
public:
    Polygon2D() = default;
    /// As setVertices().
    explicit Polygon2D(std::vector<KpVec2f> vertices) { Polygon2D::setVertices(std::move(vertices)); }

    /// Replaces the vertices and closes the list if it is not closed. A single vertex becomes two
    /// equal ones.
    void setVertices(std::vector<KpVec2f> vertices) override;
    /// Inserts `v` before the vertex that closes the list.
    void append(KpVec2f v) override;

    /// Whether `p` lies inside, or on a border that counts as inside: of two polygons that share
    /// an edge, only one contains its points.
    bool contains(const KpVec2f& p) const;
    /// `p` itself if it lies inside.
    std::pair<bool, KpVec2f> closestPoint(KpVec2f p) const override;
};
