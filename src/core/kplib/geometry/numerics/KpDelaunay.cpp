#include <kplib/geometry/numerics/KpDelaunay.h>

#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/geometry/numerics/KpRandom.h>
#include <kplib/geometry/numerics/detail/DelaunaySteps.h>
#include <kplib/log/KpLogFile.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <span>
#include <utility>

// Plan
//
// Incremental insertion: A. Bowyer, "Computing Dirichlet tessellations", and D. F. Watson,
// "Computing the n-dimensional Delaunay tessellation with application to Voronoi polytopes", both
// in The Computer Journal 24(2), 1981. The mesh starts with a simplex around all points. Each
// point p replaces the simplices whose circle contains it:
//
//     +-------+        +-------+        +-------+
//     |     / |        |       |        | \   / |
//     |   /   |        |   p   |        |   p   |
//     | /     |        |       |        | /   \ |
//     +-------+        +-------+        +-------+
//     simplices        the cavity       a fan: p with each
//     around p         and its rim      face of the rim
//
// A face of two simplices of the cavity lies inside it, a face of one is a part of the rim. So
// CavityRim::flip() adds a face at its first visit and removes it at the second.
//
//     DelaunayMesh.h      simplices and circles in numbered slots, which are reused; insertion
//     DelaunayRim.h       the rim, in an order that decides the slots of the new simplices
//     DelaunayGrid.h      finds the circles around a point in large meshes
//     DelaunayKernels.h   finds them in small ones: a scan of all circles
//     DelaunayCircle.h    contains(), whose rounding all searches share
//
// Every search returns the same slots in ascending order, apart from free ones and repetitions,
// which insert() skips. So the result depends on the points and on their shift only, not on the
// processor and not on the size from which the grid is used.
//
// Degenerate input: points are shifted at random by up to 0.5e-8 of the range, and simplices that
// are almost flat are left out of the result, like those with a corner of the enclosing simplex.

namespace kplib::detail::delaunay {
namespace {

// How many ranges the corners of the enclosing simplex lie beyond the lowest coordinates.
constexpr float far(int size)
{
    return size == 2 ? 50 : 800;
}
constexpr float near(int size)
{
    return size == 2 ? 10 : 100;
}

template <int Size>
struct Box {
    Point<Size> low{}, range{};
};

template <int Size>
Box<Size> boxOf(const KpDArray<Point<Size>>& points, int n)
{
    Box<Size> box;
    for (std::size_t axis = 0; n > 0 && axis < Size; ++axis) {
        float low = points[0][axis], high = low;
        for (int i = 1; i < n; ++i) {
            low = std::min(low, points[i][axis]);
            high = std::max(high, points[i][axis]);
        }
        box.low[axis] = low;
        box.range[axis] = high - low;
    }
    return box;
}

// Positive for corners in the order of the results, zero for a flat simplex.
template <int Size>
float volume(const KpDArray<Point<Size>>& points, const Simplex<Size>& simplex)
{
    std::array<Point<Size>, std::size_t{Size}> sides;
    for (std::size_t k = 0; k < Size; ++k)
        for (std::size_t axis = 0; axis < Size; ++axis)
            sides[k][axis] = points[simplex[k]][axis] - points[simplex[Size]][axis];
    return determinant(sides);
}

template <int Size>
void collect(const Mesh<Size>& mesh, const PointSet<Size>& set, KpDArray<Simplex<Size>>& result)
{
    float flat = set.range;
    for (int axis = 1; axis < Size; ++axis)
        flat *= set.range;
    flat *= 1e-8F;
    // Faces keep the order of their corners and new points are appended, so a corner of the
    // enclosing simplex is always the first.
    const auto volumeIn = [&](std::int32_t slot) {
        const Simplex<Size>& s = mesh[slot];
        return s[0] >= 0 && s[0] < set.n ? volume<Size>(set.points, s) : 0;
    };
    long count = 0;
    for (std::int32_t slot = 0; slot < mesh.slots(); ++slot)
        count += std::abs(volumeIn(slot)) > flat;
    result.resize(count);
    count = 0;
    for (std::int32_t slot = 0; slot < mesh.slots(); ++slot) {
        const float v = volumeIn(slot);
        if (!(std::abs(v) > flat))
            continue;
        Simplex<Size>& simplex = result[count++] = mesh[slot];
        if (!(v >= 0))
            std::swap(simplex[Size - 1], simplex[Size]);
    }
}

}  // namespace

template <int Size>
PointSet<Size> shifted(const float* coordinates, int n)
{
    PointSet<Size> set;
    set.n = std::max(n, 0);
    set.points.resize(set.n + Size + 1L);
    for (int i = 0; i < set.n; ++i)
        std::copy_n(coordinates + static_cast<long>(i) * Size, Size, set.points[i].begin());
    const Box<Size> box = boxOf<Size>(set.points, set.n);
    set.range = *std::max_element(box.range.begin(), box.range.end());
    for (int i = 0; i < set.n; ++i)
        for (float& x : set.points[i])
            x += static_cast<float>((0.5 - KpRandom::rand()) * 1e-8 * static_cast<double>(set.range));
    for (std::size_t k = 0; k <= Size; ++k)
        for (std::size_t axis = 0; axis < Size; ++axis)
            set.points[set.n + static_cast<long>(k)][axis] =
                k == axis ? box.low[axis] + far(Size) * box.range[axis] : box.low[axis] - near(Size) * box.range[axis];
    return set;
}

template <int Size>
bool triangulate(const PointSet<Size>& set, const Finder& finder, KpDArray<Simplex<Size>>& result)
{
    Mesh<Size> mesh(set.points.data(), set.n, set.range, finder);
    for (int i = 0; i < set.n; ++i)
        if (!mesh.insert(i))
            return false;
    collect(mesh, set, result);
    return true;
}

template <int Size>
Finder bestFinder()
{
    static CircleScan* const scan = best(circleScanPaths<Size>());
    return {scan, Size == 2 ? 8192 : 32768};  // from this size on the grid is faster
}

template PointSet<2> shifted(const float*, int);
template PointSet<3> shifted(const float*, int);
template bool triangulate(const PointSet<2>&, const Finder&, KpDArray<Simplex<2>>&);
template bool triangulate(const PointSet<3>&, const Finder&, KpDArray<Simplex<3>>&);
template Finder bestFinder<2>();
template Finder bestFinder<3>();

namespace {

template <typename Vector, int Size = Vector::size()>
bool triangulatePoints(const Vector* points, int n, KpDArray<Simplex<Size>>& result)
{
    static_assert(sizeof(Vector) == Size * sizeof(float));
    std::srand(367);  // callers that use the system's generator depend on it
    return triangulate(shifted<Size>(reinterpret_cast<const float*>(points), n), bestFinder<Size>(), result);
}

}  // namespace
}  // namespace kplib::detail::delaunay

bool KpDelaunay::triangulate2D(KpVec2f* points, int n, KpDArray<Triangle>& triangles)
{
    const bool fits = kplib::detail::delaunay::triangulatePoints(points, n, triangles);
    if (!fits)
        getTheLogInstance().errorf("temporary storage exceeded\n");
    return fits;
}

bool KpDelaunay::triangulate3D(KpVec3f* points, int n, KpDArray<Tetrahedron>& tetrahedra)
{
    return kplib::detail::delaunay::triangulatePoints(points, n, tetrahedra);
}
