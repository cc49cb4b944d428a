#pragma once

#include <kplib/foundation/KpCheck.h>
#include <kplib/geometry/KpVecBase.h>

/// Base of the axis-aligned boxes in space: xmin, xmax, ymin, ymax, zmin, zmax and nothing else,
/// so that the object is its own byte image. `Box` is the derived class, `Vector` the type of its
/// corners.
///
/// Both bounds belong to the box. It is empty if the minimum is above the maximum on any axis. A
/// default-constructed box is empty, from 1 to 0 on each axis.
template <typename Box, typename Vector>
class KpBox3Base {
public:
    /// Type of the bounds.
    using value_type = typename Vector::value_type;

    constexpr value_type& xmin() { return b_[0]; }       ///< least x
    constexpr value_type xmin() const { return b_[0]; }  ///< least x
    constexpr value_type& xmax() { return b_[1]; }       ///< greatest x
    constexpr value_type xmax() const { return b_[1]; }  ///< greatest x
    constexpr value_type& ymin() { return b_[2]; }       ///< least y
    constexpr value_type ymin() const { return b_[2]; }  ///< least y
    constexpr value_type& ymax() { return b_[3]; }       ///< greatest y
    constexpr value_type ymax() const { return b_[3]; }  ///< greatest y
    constexpr value_type& zmin() { return b_[4]; }       ///< least z
    constexpr value_type zmin() const { return b_[4]; }  ///< least z
    constexpr value_type& zmax() { return b_[5]; }       ///< greatest z
    constexpr value_type zmax() const { return b_[5]; }  ///< greatest z

    /// Bound `i` in the order above; not checked.
    constexpr value_type& operator[](int i)
    {
        KPLIB_CHECK(i >= 0 && i < 6, "KpBox3Base: the index is not in [0, 6)");
        return b_[i];
    }
    /// As above.
    constexpr value_type operator[](int i) const
    {
        KPLIB_CHECK(i >= 0 && i < 6, "KpBox3Base: the index is not in [0, 6)");
        return b_[i];
    }
    /// The six bounds in the order above.
    constexpr const value_type* data() const { return b_; }

    /// The lower corner.
    constexpr Vector min() const { return {b_[0], b_[2], b_[4]}; }
    /// The upper corner.
    constexpr Vector max() const { return {b_[1], b_[3], b_[5]}; }
    /// Corner `i` from 0 to 7: the maximum of x if bit 0 of `i` is set, of y if bit 1 is set, of z
    /// if bit 2 is set, else the minimum.
    constexpr Vector corner(int i) const { return {b_[i & 1], b_[2 + (i >> 1 & 1)], b_[4 + (i >> 2 & 1)]}; }
    /// max() - min(), also of an empty box.
    constexpr Vector size() const { return max() - min(); }

    /// Whether a minimum is above its maximum.
    constexpr bool isEmpty() const { return b_[0] > b_[1] || b_[2] > b_[3] || b_[4] > b_[5]; }

    /// Whether `point` lies in the box after each bound is moved outward by `tolerance`. Points on
    /// the bounds are inside, NaN is not.
    constexpr bool contains(const Vector& point, value_type tolerance = 0) const
    {
        for (int axis = 0; axis < 3; ++axis) {
            if (!(b_[2 * axis] - tolerance <= point[axis] && point[axis] <= b_[2 * axis + 1] + tolerance))
                return false;
        }
        return true;
    }

    /// Extends the box to contain `point`: an empty one becomes that point, otherwise each bound
    /// that `point` lies strictly outside of moves to it.
    constexpr void extendBy(const Vector& point)
    {
        const bool wasEmpty = isEmpty();
        for (int axis = 0; axis < 3; ++axis) {
            if (wasEmpty || point[axis] < b_[2 * axis])
                b_[2 * axis] = point[axis];
            if (wasEmpty || point[axis] > b_[2 * axis + 1])
                b_[2 * axis + 1] = point[axis];
        }
    }
    /// Extends the box to contain `other`, unless that is empty.
    constexpr void extendBy(const Box& other)
    {
        if (other.isEmpty())
            return;
        const Vector last = other.max();  // `other` may be this box
        extendBy(other.min());
        extendBy(last);
    }

    /// Exact, bound by bound.
    friend constexpr bool operator==(const Box& a, const Box& b)
    {
        for (int i = 0; i < 6; ++i) {
            if (a.b_[i] != b.b_[i])
                return false;
        }
        return true;
    }

protected:
    constexpr KpBox3Base() = default;
    /// Of these bounds as they are.
    constexpr KpBox3Base(value_type xmin, value_type xmax, value_type ymin, value_type ymax, value_type zmin,
                         value_type zmax) :
        b_{xmin, xmax, ymin, ymax, zmin, zmax}
    {
    }

private:
    value_type b_[6] = {1, 0, 1, 0, 1, 0};
};
