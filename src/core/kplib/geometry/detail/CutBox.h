#pragma once

#include <cmath>
#include <cstdint>
#include <span>

// How a plane cuts a box, from the signs of the eight corners as in marching cubes: Lorensen and Cline, "Marching
// cubes", 1987. Shared by the classes in float and in double.

namespace kplib::detail {

// The polygon for each set of corners that lie on the plane's lower side, bit i for corner i: the number of vertices,
// then the edges that they lie on, in order around it, one corner's number in the high nibble and the other's in the
// low one. A set and its complement have one polygon, so half the sets are here.
extern const std::uint8_t cuts[128][7];

// The corners of a box given as xmin, xmax, ymin, ymax, zmin, zmax; x is the upper bound in corner i if bit 0 of i is
// set, y if bit 1 is, z if bit 2 is.
template <typename Vector, typename Number>
void fillCorners(Vector (&corners)[8], std::span<const Number, 6> box)
{
    for (std::size_t i = 0; i < 8; ++i)
        corners[i] = {box[i & 1], box[2 + (i >> 1 & 1)], box[4 + (i >> 2)]};
}

template <typename Vector, typename Number>
void projectCorners(Number (&values)[8], const Vector (&corners)[8], const Vector& normal)
{
    for (int i = 0; i < 8; ++i)
        values[i] = corners[i].dot(normal);
}

// Bit i is set if `distance` is strictly above value i.
template <typename Number>
unsigned maskBelow(const Number (&values)[8], Number distance)
{
    unsigned mask = 0;
    for (unsigned i = 0; i < 8; ++i)
        mask |= static_cast<unsigned>(distance > values[i]) << i;
    return mask;
}

// Calls `vertex(i, a, b, t)` for each vertex of the cut at `distance`, which lies at `t` from corner b toward corner
// a, and gives their number.
template <typename Number, typename Vertex>
int visitCut(const Number (&values)[8], Number distance, Vertex&& vertex)
{
    const unsigned mask = maskBelow(values, distance);
    const std::uint8_t* cut = cuts[mask < 128 ? mask : mask ^ 255];
    const int count = cut[0];
    for (int i = 0; i < count; ++i) {
        const int a = cut[i + 1] >> 4, b = cut[i + 1] & 15;
        const Number difference = values[a] - values[b];
        const bool isFlat = std::abs(static_cast<double>(difference)) < 1e-8;
        vertex(i, a, b, isFlat ? Number(0.5) : (distance - values[b]) / difference);
    }
    return count;
}

// Writes the polygon with vertices between `corners`, and the same between `others` unless there is no place for it.
template <typename Number, typename Vector>
int cutCorners(const Number (&values)[8], Number distance, const Vector (&corners)[8], Vector* vertices,
               const Vector (&others)[8], Vector* otherVertices)
{
    const auto between = [](const Vector& from, const Vector& to, Number t) { return from + (to - from) * t; };
    if (otherVertices == nullptr)
        return visitCut(values, distance,
                        [&](int i, int a, int b, Number t) { vertices[i] = between(corners[b], corners[a], t); });
    return visitCut(values, distance, [&](int i, int a, int b, Number t) {
        vertices[i] = between(corners[b], corners[a], t);
        otherVertices[i] = between(others[b], others[a], t);
    });
}

}  // namespace kplib::detail
