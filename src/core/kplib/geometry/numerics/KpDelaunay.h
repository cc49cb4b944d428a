#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>

#include <array>
#include <cstdint>

class KpVec2f;
class KpVec3f;

/// Delaunay triangulations of points in the plane and in space: no point lies inside the circle or sphere through the
/// corners of another part.
///
/// The points are inserted one after the other: the parts whose circle or sphere contains the new
/// point are replaced by a fan around it (A. Bowyer, "Computing Dirichlet tessellations", and D.
/// F. Watson, both in The Computer Journal 24(2), 1981). The algorithm works on copies of the
/// points, shifted by KpRandom::rand() by up to half a hundred-millionth of their range. So equal
/// or regular points are handled, and where several triangulations are valid, two processes may
/// return different ones. Parts that are nearly flat are left out, so the hull may have small
/// gaps.
///
/// Both restart the system's generator with srand(367). They throw KpMemoryException with the result unchanged; memory
/// is linear in the number of points, and the time about n log n, for points in no special order. Any number of
/// threads.
class KPLIB_API KpDelaunay {
public:
    using Triangle = std::array<std::int32_t, 3>;     ///< indices of points
    using Tetrahedron = std::array<std::int32_t, 4>;  ///< indices of points

    /// The triangles of `n` points, counter-clockwise. False, with an error in the log and `triangles` unchanged, if
    /// one point falls into circles whose common outline has more than 1025 edges. Points in a line have no triangles.
    static bool triangulate2D(KpVec2f* points, int n, KpDArray<Triangle>& triangles);

    /// The tetrahedra of `n` points, the first three corners clockwise as seen from the fourth. False, with
    /// `tetrahedra` unchanged, if one point falls into spheres whose common surface has more than 16385 faces.
    static bool triangulate3D(KpVec3f* points, int n, KpDArray<Tetrahedron>& tetrahedra);

    /// Draws the outlines of `triangles` into an EPS file, to look at, fitted into a square of 425
    /// points. False if `path` cannot be opened; a later failure to write is not reported.
    static bool writeEPS(const char* path, KpVec2f* points, int n, KpDArray<Triangle>& triangles);
};
