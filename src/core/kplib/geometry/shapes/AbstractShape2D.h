#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec2f.h>

#include <utility>

class Rectangle2D;

/// A shape in the plane. Shapes are values of their own kind: equality asks for the same class, not a class that
/// derives from it. A shape belongs to one thread at a time.
class KPLIB_API AbstractShape2D {
public:
    AbstractShape2D() = default;
    AbstractShape2D(const AbstractShape2D&) = default;
    AbstractShape2D& operator=(const AbstractShape2D&) = default;
    virtual ~AbstractShape2D();

    /// The point of the shape next to `p`; the flag is false if it has none.
    virtual std::pair<bool, KpVec2f> closestPoint(KpVec2f p) const = 0;
    virtual Rectangle2D boundingBox() const = 0;
    virtual bool isEmpty() const = 0;
    /// Same class and exactly the same numbers.
    virtual bool equals(const AbstractShape2D& other) const = 0;

    bool operator==(const AbstractShape2D& other) const { return equals(other); }
    bool operator!=(const AbstractShape2D& other) const { return !equals(other); }
};
