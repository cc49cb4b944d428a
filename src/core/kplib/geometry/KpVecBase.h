#pragma once

#include <kplib/foundation/KpCheck.h>

#include <concepts>
#include <cstddef>
#include <cstdint>
#include <iosfwd>

/// Base of the fixed-size vectors: `Size` components of type `Component` and nothing else, so that
/// the object is its own byte image. `Vector` is the class that derives from it (KpVec3f ...) and
/// is what the operators return.
///
/// Arithmetic uses the precision of the component; sums run from x to the last component. A plain
/// value without errors and allocations; distinct objects may be used by distinct threads. A
/// default-constructed vector is not initialised.
template <typename Vector, typename Component, int Size>
class KpVecBase {
public:
    /// Type of the components.
    using value_type = Component;
    /// Number of components.
    static constexpr int size() { return Size; }

    /// Component `i`, from 0; not checked.
    constexpr Component& operator[](int i)
    {
        KPLIB_CHECK(i >= 0 && i < Size, "KpVecBase: the index is not in [0, size())");
        return v_[i];
    }
    /// As above.
    constexpr Component operator[](int i) const
    {
        KPLIB_CHECK(i >= 0 && i < Size, "KpVecBase: the index is not in [0, size())");
        return v_[i];
    }
    /// The components one after the other, x first.
    constexpr Component* data() { return v_; }
    /// As above.
    constexpr const Component* data() const { return v_; }
    constexpr Component* begin() { return v_; }                   ///< first component
    constexpr Component* end() { return v_ + Size; }              ///< past the last one
    constexpr const Component* begin() const { return v_; }       ///< first component
    constexpr const Component* end() const { return v_ + Size; }  ///< past the last one

    constexpr Component& x() { return v_[0]; }                          ///< first component
    constexpr Component x() const { return v_[0]; }                     ///< first component
    constexpr Component& y() { return v_[1]; }                          ///< second component
    constexpr Component y() const { return v_[1]; }                     ///< second component
    constexpr Component& z() requires(Size > 2) { return v_[2]; }       ///< third component
    constexpr Component z() const requires(Size > 2) { return v_[2]; }  ///< third component
    constexpr Component& w() requires(Size > 3) { return v_[3]; }       ///< fourth component
    constexpr Component w() const requires(Size > 3) { return v_[3]; }  ///< fourth component

    /// The sum of the products of the components.
    constexpr Component dot(const Vector& other) const
    {
        Component sum = v_[0] * other.v_[0];
        for (int i = 1; i < Size; ++i)
            sum += v_[i] * other.v_[i];
        return sum;
    }
    /// The cross product, by the right-hand rule.
    constexpr Vector cross(const Vector& other) const requires(Size == 3)
    {
        return {y() * other.z() - z() * other.y(), z() * other.x() - x() * other.z(),
                x() * other.y() - y() * other.x()};
    }
    /// The sum of the squares.
    constexpr Component squaredLength() const { return dot(static_cast<const Vector&>(*this)); }
    /// The square root of squaredLength(); of integers its whole part.
    Component length() const
    {
        // The compiler's built-in roots: <cmath> would double the time to compile this header.
        if constexpr (std::same_as<Component, float>)
            return __builtin_sqrtf(squaredLength());
        else if constexpr (std::same_as<Component, double>)
            return __builtin_sqrt(squaredLength());
        else
            return static_cast<Component>(__builtin_sqrtl(static_cast<long double>(squaredLength())));
    }

    // Operators between two vectors work component by component, those with a number on each component.

    /// Component by component, or on each component.
    constexpr Vector& operator+=(const Vector& other)
    {
        for (int i = 0; i < Size; ++i)
            v_[i] += other.v_[i];
        return self();
    }
    /// Component by component, or on each component.
    constexpr Vector& operator-=(const Vector& other)
    {
        for (int i = 0; i < Size; ++i)
            v_[i] -= other.v_[i];
        return self();
    }
    /// Component by component, or on each component.
    constexpr Vector& operator*=(const Vector& other)
    {
        for (int i = 0; i < Size; ++i)
            v_[i] *= other.v_[i];
        return self();
    }
    /// Component by component, or on each component.
    constexpr Vector& operator/=(const Vector& other)
    {
        for (int i = 0; i < Size; ++i)
            v_[i] /= other.v_[i];
        return self();
    }
    /// Component by component, or on each component.
    constexpr Vector& operator*=(Component factor)
    {
        for (Component& c : v_)
            c *= factor;
        return self();
    }

    /// Divides each component. Integers are truncated toward zero and must not be divided by 0.
    constexpr Vector& operator/=(Component divisor)
    {
        for (Component& c : v_)
            c /= divisor;
        return self();
    }

    /// Component by component, or on each component.
    friend constexpr Vector operator+(Vector a, const Vector& b) { return a += b; }
    /// Component by component, or on each component.
    friend constexpr Vector operator-(Vector a, const Vector& b) { return a -= b; }
    /// Component by component, or on each component.
    friend constexpr Vector operator*(Vector a, const Vector& b) { return a *= b; }
    /// Component by component, or on each component.
    friend constexpr Vector operator/(Vector a, const Vector& b) { return a /= b; }
    /// Component by component, or on each component.
    friend constexpr Vector operator*(Vector a, Component factor) { return a *= factor; }
    /// Component by component, or on each component.
    friend constexpr Vector operator*(Component factor, Vector a) { return a *= factor; }
    /// Component by component, or on each component.
    friend constexpr Vector operator/(Vector a, Component divisor) { return a /= divisor; }
    /// Each component negated.
    friend constexpr Vector operator-(Vector a)
    {
        for (Component& c : a.v_)
            c = -c;
        return a;
    }
    /// Exact; a vector that holds a NaN equals none.
    friend constexpr bool operator==(const Vector& a, const Vector& b)
    {
        for (int i = 0; i < Size; ++i) {
            if (a.v_[i] != b.v_[i])
                return false;
        }
        return true;
    }
    /// "(x, y, z)"
    template <typename Traits>
    friend std::basic_ostream<char, Traits>& operator<<(std::basic_ostream<char, Traits>& out, const Vector& vector)
    {
        for (int i = 0; i < Size; ++i)
            out << (i == 0 ? "(" : ", ") << vector.v_[i];
        return out << ')';
    }

protected:
    constexpr KpVecBase() = default;
    /// Of these components.
    template <std::same_as<Component>... Components>
    requires(sizeof...(Components) == Size) constexpr KpVecBase(Components... components) : v_{components...} {}
    /// Each component converted as by static_cast.
    template <typename OtherVector, typename OtherComponent>
    constexpr explicit KpVecBase(const KpVecBase<OtherVector, OtherComponent, Size>& other)
    {
        for (int i = 0; i < Size; ++i)
            v_[i] = static_cast<Component>(other[i]);
    }

    /// Divides by length() and returns it. A length of exactly 0 changes nothing.
    Component normalizeByLength()
    {
        const Component length = this->length();
        if (length != 0)
            *this /= length;
        return length;
    }

private:
    constexpr Vector& self() { return static_cast<Vector&>(*this); }

    Component v_[static_cast<std::size_t>(Size)];
};

/// A hash of the lowest 5 bits of each component, x in the highest place, as those of KpHash.h.
template <typename Vector, int Size>
constexpr unsigned int kp_hash(const KpVecBase<Vector, std::int32_t, Size>& v)
{
    unsigned int h = 0;
    for (const std::int32_t component : v)
        h = h << 5 | (static_cast<unsigned int>(component) & 31);
    return h;
}
