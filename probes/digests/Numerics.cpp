#include "Digest.h"

#include <kplib/kplib.h>

#include <algorithm>
#include <iterator>

namespace kplib::test {
namespace {

/// Points of numbers from -2 to 2.
template <typename Point>
std::vector<Point> points(Random& random, int n)
{
    std::vector<Point> result(n);
    for (Point& point : result)
        for (float& component : point)
            component = static_cast<float>(random()) * 0x1p-30F - 2;
    return result;
}

int spiral(const KpVec3f& x, KpVec3f& derivative, void*)
{
    derivative = KpVec3f(-x.y() + x.x() / 8, x.x(), x.z() / 4 + 1);
    return 0;
}

void ode(Digest& digest, Random& random)
{
    for (int method = KpODE3::RK21; method <= KpODE3::RKCK; ++method) {
        KpODE3 curve;
        KpVec3f point, derivative;
        curve.setMethod(method);
        curve.setRightHandSide(spiral, nullptr);
        curve.setTolerance(1e-4F);
        curve.setHSampling(0.07F);
        curve.setHMinMax(1e-4F, 0.5F);
        curve.init(points<KpVec3f>(random, 1)[0], 0.1F);
        for (int i = 0; i < 200; ++i) {
            const int code = curve.next(point, derivative);
            digest.take(code, point, derivative, curve.h());
        }
    }
}

void alignment(Digest& digest, Random& random)
{
    for (int i = 0; i < 200; ++i) {
        const int n = 3 + i % 50;
        const auto from = points<KpVec3f>(random, n), to = points<KpVec3f>(random, n);
        std::vector<float> weights(n);
        for (float& weight : weights)
            weight = static_cast<float>(random() % 1000);
        for (const int mode : {0, 1, 2}) {
            KpMat4f even, weighted;
            kpAlignPointSets(even, from.data(), to.data(), n, mode);
            kpAlignPointSets(weighted, from.data(), to.data(), weights.data(), n, mode);
            digest.take(even, weighted);
        }
    }
}

void fit(Digest& digest, Random& random)
{
    for (int i = 0; i < 200; ++i) {
        KpFitPlane plane;
        for (const KpVec3f& point : points<KpVec3f>(random, 4 + i))
            plane.points().append(point);
        const float error = plane.orthogonalPlaneFit();
        digest.take(error, plane.createPlane(), plane.centroid(), plane.normal());
    }
}

void delaunay(Digest& digest, Random& random)
{
    for (const int n : {3, 10, 300}) {
        auto flat = points<KpVec2f>(random, n);
        auto solid = points<KpVec3f>(random, n);
        KpDArray<KpDelaunay::Triangle> triangles;
        KpDArray<KpDelaunay::Tetrahedron> tetrahedra;
        digest.take(KpDelaunay::triangulate2D(flat.data(), n, triangles), triangles);
        digest.take(KpDelaunay::triangulate3D(solid.data(), n, tetrahedra), tetrahedra);
    }
}

void dense(Digest& digest, Random& random)
{
    for (const int n : {1, 2, 5, 30, 67}) {
        KpDMatrix<float> a(n, n), u(n, n), v(n, n);
        std::vector<float> w(n), side(n, 1.0F);
        for (int i = 0; i < n * n; ++i)
            a.data()[i] = static_cast<float>(random()) * 0x1p-30F - 2;
        float* sides[] = {side.data()};
        digest.take(a.SVD(u, w.data(), v, 50), w, std::span(u.data(), n * n), std::span(v.data(), n * n));
        digest.take(a.solveLRdecomp(sides, 1), side);
        a *= a;
        digest.take(std::span(a.data(), n * n));
    }
}

void statistics(Digest& digest, Random& random)
{
    for (int i = 0; i < 2000; ++i) {
        const float x = static_cast<float>(random() % 10000) / 16 + 0.01F,
                    y = static_cast<float>(random() % 1000) / 999;
        digest.take(KpStatistics::gammln(x), KpStatistics::betai(x / 8, 3, y),
                    KpStatistics::integratedStudentDistribution(y * 3, x),
                    KpStatistics::tTest(9, y, 1, 12, 0.4F, y + 1));
    }
    KpRandom uniform(42);
    for (int i = 0; i < 1000; ++i)
        digest.take(uniform.next());
}

void polylines(Digest& digest, Random& random)
{
    KpDArray<KpVec2f> line, thinned;
    for (const KpVec2f& point : points<KpVec2f>(random, 1000))
        line.append(point);
    for (const float tolerance : {0.01F, 0.5F, 1.5F}) {
        KpPls::DouglasPeucker(line, tolerance, thinned);
        digest.take(thinned);
        KpPls::DouglasPeuckerInLoop(line, tolerance, thinned);
        digest.take(thinned);
        KpPls::ReumannWitkam(line, tolerance, thinned);
        digest.take(thinned);
    }
}

void colours(Digest& digest, Random& random)
{
    for (int i = 0; i < 20000; ++i) {
        float rgb[3], xyz[3], lab[3], back[3];
        for (float& part : rgb)
            part = static_cast<float>(random() % 256) / 255;
        rgb2XYZ(rgb, xyz);
        if (i % 2) {  // greys have differences of nearly equal roots
            const float part = static_cast<float>(random()) * 0x1p-32F;
            std::copy_n(std::begin({95.047F * part, 100 * part, 108.883F * part}), 3, xyz);
        }
        XYZ2CIELab(xyz, lab);
        digest.take(xyz, lab);
        CIELab2XYZ(lab, xyz);
        const bool isOutside = XYZ2rgb(xyz, back);
        digest.take(xyz, back, isOutside);
    }
}

}  // namespace

void digestsOfNumerics()
{
    family("colours", colours);
    family("ode", ode);
    family("alignment", alignment);
    family("fit", fit);
    family("delaunay", delaunay);
    family("denseMatrices", dense);
    family("statistics", statistics);
    family("polylines", polylines);
}

}  // namespace kplib::test
