#include "Operation.h"

#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/geometry/numerics/KpAlignPointSets.h>
#include <kplib/geometry/numerics/KpDMatrix.h>
#include <kplib/geometry/numerics/KpDelaunay.h>
#include <kplib/geometry/numerics/KpFitPlane.h>
#include <kplib/geometry/numerics/KpPls.h>

#include <array>
#include <cmath>

namespace kplib::probe {

namespace {

KpDMatrix<float> matrix(int rows, int cols)
{
    KpDMatrix<float> result(rows, cols);
    for (int i = 0; i < rows * cols; ++i)
        result.data()[i] = static_cast<float>(i * 7 % 11) + (i % (cols + 1) == 0 ? 20.0F : 0.0F);
    return result;
}

Digest digestOf(const KpDMatrix<float>& m)
{
    return Digest().add(m.data(), static_cast<unsigned long>(m.rows() * m.cols()) * sizeof(float));
}

Outcome products()
{
    KpDMatrix<float> product = matrix(6, 4);
    product *= matrix(4, 5);
    product.transpose();
    return digestOf(product);
}

Outcome singularValues()
{
    const KpDMatrix<float> m = matrix(6, 4);
    KpDMatrix<float> u, v;
    float w[4];
    if (!m.SVD(u, w, v, 30))
        return {};
    return digestOf(u).add(w, sizeof w);
}

Outcome solutions()
{
    const KpDMatrix<float> m = matrix(5, 5);
    std::array<float, 5> side{1, 2, 3, 4, 5};
    float* sides[] = {side.data()};
    if (m.solveLRdecomp(sides, 1) != 0)
        return {};
    return Digest().add(side.data(), sizeof side);
}

template <int mode>
Outcome aligned()
{
    std::array<KpVec3f, 20> from, to;
    for (unsigned long i = 0; i < from.size(); ++i) {
        const auto t = static_cast<float>(i);
        from[i] = KpVec3f(std::sin(t), std::cos(2 * t), std::sin(3 * t));
        to[i] = KpVec3f(-from[i].y(), from[i].x(), from[i].z()) + KpVec3f(1, 2, 3);
    }
    KpMat4f result;
    kpAlignPointSets(result, to.data(), from.data(), static_cast<int>(from.size()), mode);
    return Digest().add(&result, sizeof result);
}

Outcome triangles()
{
    std::array<KpVec2f, 40> points;
    for (unsigned long i = 0; i < points.size(); ++i)
        points[i] = KpVec2f(std::sin(static_cast<float>(i * i)), std::cos(static_cast<float>(i)));
    KpDArray<KpDelaunay::Triangle> found;
    if (!KpDelaunay::triangulate2D(points.data(), static_cast<int>(points.size()), found))
        return {};
    return Digest().add(found.data(), static_cast<unsigned long>(found.size()) * sizeof found[0]);
}

Outcome tetrahedra()
{
    std::array<KpVec3f, 30> points;
    for (unsigned long i = 0; i < points.size(); ++i) {
        const auto t = static_cast<float>(i * i);
        points[i] = KpVec3f(std::sin(t), std::cos(t * 2), std::sin(t * 3));
    }
    KpDArray<KpDelaunay::Tetrahedron> found;
    if (!KpDelaunay::triangulate3D(points.data(), static_cast<int>(points.size()), found))
        return {};
    return Digest().add(found.data(), static_cast<unsigned long>(found.size()) * sizeof found[0]);
}

Outcome planes()
{
    KpFitPlane fit;
    for (int i = 0; i < 30; ++i)
        fit.points().append(KpVec3f(static_cast<float>(i % 6), static_cast<float>(i / 6), 1));
    fit.fit();
    return Digest().add(&fit.normal(), sizeof fit.normal());
}

Outcome simplified()
{
    KpDArray<KpVec2f> line, result;
    for (int i = 0; i < 50; ++i)
        line.append(KpVec2f(static_cast<float>(i), std::sin(static_cast<float>(i) / 5)));
    KpPls::DouglasPeucker(line, 0.1F, result);
    KpPls::ReumannWitkam(line, 0.1F);
    return Digest() << result.size() << line.size();
}

}  // namespace

Operations numericsOperations()
{
    static constexpr Operation list[] = {
        {"products of matrices", products}, {"singular values", singularValues}, {"linear systems", solutions},
        {"rigid alignment", aligned<0>},    {"scaled alignment", aligned<1>},    {"affine alignment", aligned<2>},
        {"triangles", triangles},           {"tetrahedra", tetrahedra},          {"planes", planes},
        {"simplified lines", simplified},
    };
    return list;
}

}  // namespace kplib::probe
