#pragma once

#include <kplib/geometry/shapes/Polyline2D.h>

#include <utility>
#include <vector>

/// A filled polygon: a closed list of vertices, whose last one is the first again. It may cross
/// itself; the even-odd rule decides what is inside.
class KPLIB_API Polygon2D : public Polyline2D {
public:
    Polygon2D() = default;
    /// As setVertices().
    explicit Polygon2D(std::vector<KpVec2f> vertices) { Polygon2D::setVertices(std::move(vertices)); }

    /// Closes the list, if it isn't closed. A single vertex becomes two equal ones.
    void setVertices(std::vector<KpVec2f> vertices) override;
    /// Puts `v` in front of the vertex that closes the list.
    void append(KpVec2f v) override;

    /// Whether `p` lies inside, or on those borders that count as inside: neighbours that share an edge don't both hold
    /// it.
    bool contains(const KpVec2f& p) const;
    /// `p` itself if it lies inside.
    std::pair<bool, KpVec2f> closestPoint(KpVec2f p) const override;
};
