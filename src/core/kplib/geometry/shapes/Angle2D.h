#pragma once

#include <kplib/geometry/shapes/Polyline2D.h>

#include <utility>
#include <vector>

/// An angle: three vertices, with the apex in the middle.
class KPLIB_API Angle2D : public Polyline2D {
public:
    Angle2D() = default;
    /// Accepts any number of vertices; the changes below accept three only.
    explicit Angle2D(std::vector<KpVec2f> vertices) : Polyline2D(std::move(vertices)) {}

    /// Replaces the vertices. Ignored unless there are three.
    void setVertices(std::vector<KpVec2f> vertices) override;
    /// Appends a vertex. Ignored if there are three already.
    void append(KpVec2f v) override;

    /// Whether there are fewer than three vertices.
    bool isEmpty() const override { return size() < 3; }
    /// Whether the angle is not empty and the squared length of both arms is large enough to
    /// measure it, 0.001.
    bool isValid() const;
    /// The angle in radians from 0 to pi, 0 if the outer vertices are equal. The flag is false
    /// unless isValid().
    std::pair<bool, float> angle() const;

private:
    KpVec2f arm(size_t outer) const { return at(outer) - at(1); }
};
