#pragma once

#include <kplib/geometry/shapes/AbstractEllipse2D.h>

/// An ellipse along the axes.
class KPLIB_API Ellipse2D : public AbstractEllipse2D {
public:
    /// Empty, around the origin.
    Ellipse2D() = default;
    /// Of that centre and these radii.
    Ellipse2D(const KpVec2f& center, float radiusX, float radiusY) :
        AbstractEllipse2D(center), radiusX_(radiusX), radiusY_(radiusY)
    {
    }

    /// Inscribed in the box with the corners `a` and `b`, whichever they are.
    static Ellipse2D span(const KpVec2f& a, const KpVec2f& b);
    /// Through the four corners of that box.
    static Ellipse2D spanInner(const KpVec2f& a, const KpVec2f& b);

    /// Makes it span the box in x, or in y, alone.
    void spanX(const KpVec2f& a, const KpVec2f& b);
    /// As above.
    void spanY(const KpVec2f& a, const KpVec2f& b);

    /// @{
    /// Replaces one or both radii.
    void setRadius(const KpVec2f& radii);
    void setRadiusX(float radius) { radiusX_ = radius; }
    void setRadiusY(float radius) { radiusY_ = radius; }
    /// @}

    bool equals(const AbstractShape2D& other) const override;
    /// @{
    /// A radius.
    float radiusX() const override { return radiusX_; }
    float radiusY() const override { return radiusY_; }
    /// @}

    KpVec2f projectPoint(float angle) const override { return onOutline(angle, radiusX_, radiusY_); }

private:
    float radiusX_ = 0;
    float radiusY_ = 0;
};
