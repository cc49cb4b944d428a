#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace kplib::detail::delaunay {

// In the plane (Size 2) a simplex is a triangle, its faces are edges and its sphere is a circle.

template <int Size>
using Point = std::array<float, std::size_t{Size}>;
template <int Size>
using Position = std::array<double, std::size_t{Size}>;
template <int Size>
using Face = std::array<std::int32_t, std::size_t{Size}>;
template <int Size>
using Simplex = std::array<std::int32_t, std::size_t{Size} + 1>;

template <int Size>
struct Circle {
    Position<Size> center;
    double squaredRadius;
};

// Whether `point` is inside or on `circle`. Every other implementation has to round as this one
// does. A NaN counts as inside.
template <int Size>
bool contains(const Circle<Size>& circle, const Position<Size>& point)
{
    double rest = circle.squaredRadius;
    for (std::size_t axis = 0; axis < Size; ++axis) {
        const double d = point[axis] - circle.center[axis];
        rest -= d * d;
        if (rest < 0)
            return false;
    }
    return true;
}

template <typename T>
T determinant(const std::array<std::array<T, 2>, 2>& m)
{
    return m[0][0] * m[1][1] - m[0][1] * m[1][0];
}

template <typename T>
T determinant(const std::array<std::array<T, 3>, 3>& m)
{
    return m[0][0] * (m[1][1] * m[2][2] - m[1][2] * m[2][1]) - m[0][1] * (m[1][0] * m[2][2] - m[1][2] * m[2][0]) +
           m[0][2] * (m[1][0] * m[2][1] - m[1][1] * m[2][0]);
}

// The circle through point `last` and the corners of `face`. Its centre is the intersection of the
// bisectors between `last` and each corner.
template <int Size>
Circle<Size> circleThrough(const Point<Size>* points, const Face<Size>& face, int last)
{
    const Point<Size>& p = points[last];
    std::array<Position<Size>, std::size_t{Size}> sides;
    Position<Size> right{};
    for (std::size_t k = 0; k < Size; ++k)
        for (std::size_t axis = 0; axis < Size; ++axis) {
            const auto corner = static_cast<double>(points[face[k]][axis]), origin = static_cast<double>(p[axis]);
            sides[k][axis] = corner - origin;
            right[k] += (corner + origin) * sides[k][axis] / 2;
        }
    const double all = determinant(sides);
    Circle<Size> circle{};
    for (std::size_t axis = 0; axis < Size; ++axis) {
        auto replaced = sides;  // Cramer's rule
        for (std::size_t k = 0; k < Size; ++k)
            replaced[k][axis] = right[k];
        circle.center[axis] = determinant(replaced) / all;
        const double d = circle.center[axis] - static_cast<double>(p[axis]);
        circle.squaredRadius += d * d;
    }
    return circle;
}

}  // namespace kplib::detail::delaunay
