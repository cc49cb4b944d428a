#pragma once

#include <kplib/geometry/shapes/AbstractShape2D.h>

#include <vector>

/// A shape of straight sides.
class KPLIB_API Shape2D : public AbstractShape2D {
public:
    Shape2D() = default;
    /// @{
    /// Copies the shape.
    Shape2D(const Shape2D&) = default;
    Shape2D& operator=(const Shape2D&) = default;
    /// @}

    ~Shape2D() override;

    /// Its corners in order; a closed shape repeats the first one at the end.
    virtual std::vector<KpVec2f> vertices() const = 0;
};
