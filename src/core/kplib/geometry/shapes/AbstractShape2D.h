#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec2f.h>

#include <utility>

class Rectangle2D;

/// A shape in the plane. Shapes are values of their own kind: equal shapes are of the same class,
/// not of one that derives from it. A shape belongs to one thread at a time.
class KPLIB_API AbstractShape2D {
public:
    AbstractShape2D() = default;
    /// @{
    /// Copies the shape.
    AbstractShape2D(const AbstractShape2D&) = default;
    AbstractShape2D& operator=(const AbstractShape2D&) = default;
    /// @}

    virtual ~AbstractShape2D();

    /// The point of the shape next to `p`; the flag is false if it has none.
    virtual std::pair<bool, KpVec2f> closestPoint(KpVec2f p) const = 0;
    /// The smallest rectangle around the shape.
    virtual Rectangle2D boundingBox() const = 0;
    /// Whether the shape has no points.
    virtual bool isEmpty() const = 0;
    /// Same class and exactly the same numbers.
    virtual bool equals(const AbstractShape2D& other) const = 0;

    /// @{
    /// By equals().
    bool operator==(const AbstractShape2D& other) const { return equals(other); }
    bool operator!=(const AbstractShape2D& other) const { return !equals(other); }
    /// @}
};
