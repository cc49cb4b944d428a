#pragma once

#include <kplib/geometry/numerics/detail/DelaunayMesh.h>

namespace kplib::detail::delaunay {

// A shifted copy of the caller's points, followed by the corners of a simplex around them.
template <int Size>
struct PointSet {
    KpDArray<Point<Size>> points;
    int n = 0;
    float range = 0;  // the largest along an axis, before the shift
};

// Reads `n` points of Size coordinates each, and draws Size numbers for each of them.
template <int Size>
PointSet<Size> shifted(const float* coordinates, int n);

// Writes `result` and returns true, unless a cavity is too large.
template <int Size>
bool triangulate(const PointSet<Size>& set, const Finder& finder, KpDArray<Simplex<Size>>& result);

// The fastest on this processor.
template <int Size>
Finder bestFinder();

}  // namespace kplib::detail::delaunay
