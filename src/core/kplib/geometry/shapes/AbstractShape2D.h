#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec2f.h>

#include <utility>

class Rectangle2D;

/// A shape in the plane. Equal shapes have the same class; a shape never equals one of a derived
/// class. One thread at a time.
class KPLIB_API AbstractShape2D {
public:
    AbstractShape2D() = default;
    /// @{
    /// Copies the shape.
    AbstractShape2D(const AbstractShape2D&) = default;
    AbstractShape2D& operator=(const AbstractShape2D&) = default;
    /// @}

    virtual ~AbstractShape2D();

    /// The point of the shape nearest to `p`. The flag is false if the shape has no points.
    virtual std::pair<bool, KpVec2f> closestPoint(KpVec2f p) const = 0;
    /// The smallest rectangle around the shape.
    virtual Rectangle2D boundingBox() const = 0;
    /// Whether the shape has no points.
    virtual bool isEmpty() const = 0;
    /// Whether class and numbers are exactly the same.
    virtual bool equals(const AbstractShape2D& other) const = 0;

    /// @{
    /// By equals().
    bool operator==(const AbstractShape2D& other) const { return equals(other); }
    bool operator!=(const AbstractShape2D& other) const { return !equals(other); }
    /// @}
};
