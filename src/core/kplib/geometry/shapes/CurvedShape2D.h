#pragma once

#include <kplib/geometry/shapes/AbstractShape2D.h>

#include <vector>

/// A shape with a curved outline.
class KPLIB_API CurvedShape2D : public AbstractShape2D {
public:
    CurvedShape2D() = default;
    /// @{
    /// Copies the shape.
    CurvedShape2D(const CurvedShape2D&) = default;
    CurvedShape2D& operator=(const CurvedShape2D&) = default;
    /// @}

    ~CurvedShape2D() override;

    /// The ends of `segments` chords in order, one point more than chords; the last nearly repeats the first.
    virtual std::vector<KpVec2f> tesselate(unsigned int segments) const = 0;
};
