#pragma once

#include <kplib/geometry/shapes/CurvedShape2D.h>

#include <utility>
#include <vector>

/// An ellipse along the axes: the base of circles and ellipses.
class KPLIB_API AbstractEllipse2D : public CurvedShape2D {
public:
    /// The centre.
    const KpVec2f& center() const { return center_; }
    /// Moves the centre.
    void setCenter(const KpVec2f& center) { center_ = center; }
    /// Both radii.
    KpVec2f radius() const { return {radiusX(), radiusY()}; }

    /// An approximation: the point of the outline in the direction of `p` after the ellipse is
    /// scaled to a circle.
    std::pair<bool, KpVec2f> closestPoint(KpVec2f p) const override;
    /// The box of centre and radii.
    Rectangle2D boundingBox() const override;
    /// Both radii are exactly 0.
    bool isEmpty() const override;
    std::vector<KpVec2f> tesselate(unsigned int segments) const override;

    /// @{
    /// A radius.
    virtual float radiusX() const = 0;
    virtual float radiusY() const = 0;
    /// @}

    /// The enclosed area.
    virtual float area() const;
    /// By S. Ramanujan's second approximation ("Modular equations and approximations to pi", 1914).
    virtual float circumference() const;
    /// The point of the outline at an angle in radians, from x to y, measured on the circle of
    /// which the ellipse is a scaled image.
    virtual KpVec2f projectPoint(float angle) const = 0;

protected:
    AbstractEllipse2D() = default;
    /// An ellipse with that centre.
    explicit AbstractEllipse2D(const KpVec2f& center) : center_(center) {}

    /// The point at `angle` for these radii.
    KpVec2f onOutline(float angle, float radiusX, float radiusY) const;

private:
    KpVec2f center_{0, 0};
};
