#pragma once

#include <kplib/geometry/KpVec2f.h>

/// An axis-aligned rectangle, stored as its lower and its upper corner: xmin, ymin, xmax, ymax.
/// Boxes in space are stored as intervals instead. Both bounds belong to the rectangle. It is
/// empty if a minimum is above its maximum; a default-constructed one is empty, from (1, 1) to (0,
/// 0).
class KpBox2f {
public:
    constexpr KpBox2f() = default;
    /// @{
    /// Of these bounds as they are.
    constexpr KpBox2f(float xmin, float ymin, float xmax, float ymax) : min_(xmin, ymin), max_(xmax, ymax) {}
    constexpr KpBox2f(const KpVec2f& min, const KpVec2f& max) : min_(min), max_(max) {}
    /// @}

    /// A bound.
    constexpr float& xmin() { return min_.x(); }
    /// A bound.
    constexpr float xmin() const { return min_.x(); }
    /// A bound.
    constexpr float& ymin() { return min_.y(); }
    /// A bound.
    constexpr float ymin() const { return min_.y(); }
    /// A bound.
    constexpr float& xmax() { return max_.x(); }
    /// A bound.
    constexpr float xmax() const { return max_.x(); }
    /// A bound.
    constexpr float& ymax() { return max_.y(); }
    /// A bound.
    constexpr float ymax() const { return max_.y(); }
    /// @{
    /// A corner.
    constexpr const KpVec2f& min() const { return min_; }
    constexpr const KpVec2f& max() const { return max_; }
    /// @}

    /// max() - min(), also of an empty rectangle.
    constexpr KpVec2f size() const { return max_ - min_; }

    /// Whether a minimum is above its maximum.
    constexpr bool isEmpty() const { return min_.x() > max_.x() || min_.y() > max_.y(); }

    /// Extends the rectangle to contain `point`: an empty one becomes that point, otherwise each
    /// bound that `point` lies strictly outside of moves to it.
    constexpr void extendBy(const KpVec2f& point)
    {
        const bool wasEmpty = isEmpty();
        for (int axis = 0; axis < 2; ++axis) {
            if (wasEmpty || point[axis] < min_[axis])
                min_[axis] = point[axis];
            if (wasEmpty || point[axis] > max_[axis])
                max_[axis] = point[axis];
        }
    }

    /// Exact, bound by bound.
    friend constexpr bool operator==(const KpBox2f&, const KpBox2f&) = default;

private:
    KpVec2f min_{1, 1}, max_{0, 0};
};

static_assert(sizeof(KpBox2f) == 16);
