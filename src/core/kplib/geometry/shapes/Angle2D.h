#pragma once

#include <kplib/geometry/shapes/Polyline2D.h>

#include <utility>
#include <vector>

/// An angle: three vertices, with the apex in the middle.
class KPLIB_API Angle2D : public Polyline2D {
public:
    Angle2D() = default;
    /// Any number of vertices; changes take three alone.
    explicit Angle2D(std::vector<KpVec2f> vertices) : Polyline2D(std::move(vertices)) {}

    /// Ignores what isn't three vertices.
    void setVertices(std::vector<KpVec2f> vertices) override;
    /// Ignored once there are three.
    void append(KpVec2f v) override;

    /// Fewer than three vertices.
    bool isEmpty() const override { return size() < 3; }
    /// Not empty, and both arms long enough to measure an angle: 0.001 squared units.
    bool isValid() const;
    /// In radians from 0 to pi, 0 if the outer vertices are the same; the flag is false unless isValid().
    std::pair<bool, float> angle() const;

private:
    KpVec2f arm(size_t outer) const { return at(outer) - at(1); }
};
