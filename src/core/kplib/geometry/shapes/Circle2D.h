#pragma once

#include <kplib/geometry/shapes/AbstractEllipse2D.h>

#include <numbers>

/// A circle.
class KPLIB_API Circle2D : public AbstractEllipse2D {
public:
    /// Empty, around the origin.
    Circle2D() = default;
    /// Of that centre and radius.
    Circle2D(const KpVec2f& center, float radius) : AbstractEllipse2D(center), radius_(radius) {}

    /// The radius.
    float radius() const { return radius_; }
    /// Replaces the radius.
    void setRadius(float radius) { radius_ = radius; }

    bool equals(const AbstractShape2D& other) const override;
    /// @{
    /// The radius.
    float radiusX() const override { return radius_; }
    float radiusY() const override { return radius_; }
    /// @}

    float circumference() const override { return radius_ * (2 * std::numbers::pi_v<float>); }
    KpVec2f projectPoint(float angle) const override { return onOutline(angle, radius_, radius_); }

private:
    float radius_ = 0;
};
