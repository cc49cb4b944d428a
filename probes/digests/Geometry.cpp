#include "Digest.h"

#include <kplib/kplib.h>

#include <array>

namespace kplib::test {
namespace {

float number(Random& random)
{
    return static_cast<float>(random()) * 0x1p-30F - 2;
}

/// An object of floats from -2 to 2.
template <typename Object>
Object some(Random& random)
{
    std::array<float, sizeof(Object) / 4> numbers;
    for (float& n : numbers)
        n = number(random);
    return std::bit_cast<Object>(numbers);
}

KpRotation turned(Random& random)
{
    const auto axis = some<KpVec3f>(random);
    return KpRotation(axis, number(random));
}

KpViewVolume view(Random& random)
{
    KpViewVolume volume;
    if (random() % 2)
        volume.perspective(0.9F + number(random) / 4, 1.2F, 1.5F, 6);
    else
        volume.ortho(-1, 2, -1.5F, 1, 0.5F, 5 + number(random));
    volume.translateCamera(some<KpVec3f>(random));
    volume.rotateCamera(turned(random));
    return volume;
}

constexpr int rounds = 1000;

template <typename Work>
void repeated(const char* name, Work work)
{
    family(name, [&](Digest& digest, Random& random) {
        for (int i = 0; i < rounds; ++i)
            work(digest, random);
    });
}

void matrices()
{
    repeated("vectors", [](Digest& digest, Random& random) {
        const auto u = some<KpVec3f>(random), v = some<KpVec3f>(random);
        KpVec3f unit = u;
        KpVec2f flat(u.x(), v.y());
        KpVec3l big(0, 0, 0);
        for (std::int64_t& component : big)
            component = static_cast<std::int64_t>(random() >> 2);
        digest.take(unit.normalize(), unit, u.dot(v), u.cross(v), u + 2.0F * (u - v) / v.x(), flat.normalize(), flat);
        digest.take(big.length(), KpVec3i(30000, static_cast<int>(random() % 30000), 5).length(),
                    static_cast<float>(KpVec3d(u).length()));
    });
    repeated("matrices", [](Digest& digest, Random& random) {
        const auto m = some<KpMat4f>(random), n = some<KpMat4f>(random);
        const auto a = some<KpMat3f>(random), b = some<KpMat3f>(random);
        const auto v = some<KpVec3f>(random);
        digest.take(m * n, m.det3(), m.det4(), m.inverse(), m.multVecMatrix(v), m.multMatrixVec(v), m.multDirMatrix(v));
        digest.take(a * b, a.inverse(), a.multVecMatrix(v), a.symmInverse(2));
        KpMat4f affine(a), inverse;
        affine.setTranslate(v);
        digest.take(KpMat4f::affine_inverse(affine, inverse), inverse);
    });
    repeated("decompositions", [](Digest& digest, Random& random) {
        auto m = some<KpMat4f>(random);
        int index[4], steps = 0;
        float sign = 0, values[3], vectors[3][3], side[4] = {1, 2, 3, 4};
        KpMat4f r, u, projection, affine(some<KpMat3f>(random));
        KpVec3f s, t;
        KpRotation rotation, orientation;
        digest.take(affine.factor(r, s, u, t, projection), r, s, u, t, projection);
        affine.getTransform(t, rotation, s, orientation);
        digest.take(t, rotation, s, orientation);
        const auto a = some<KpMat3f>(random);
        KpMat4f(a * a.transpose()).jacobi3(values, vectors, steps);
        digest.take(values, vectors, steps, m.LUDecomposition(index, sign), m, index, sign);
        m.LUBackSubstitution(index, side);
        digest.take(side);
    });
    repeated("rotations", [](Digest& digest, Random& random) {
        const KpRotation p = turned(random), q = turned(random);
        const auto v = some<KpVec3f>(random), w = some<KpVec3f>(random);
        KpVec3f axis;
        float angle = 0;
        KpRotation scaled = p;
        scaled.scaleAngle(0.3F);
        p.getValue(axis, angle);
        digest.take(MathUtils::angleBetweenVectors(v, w, {0.3F, -1, 0.2F}), p, p * q, p.inverse(), p.toMat3f(),
                    KpRotation(p.toMat3f()), axis, angle, p * v, scaled);
        digest.take(KpRotation(v, w), KpRotation(v, w, w, v), KpRotation::slerp(p, q, 0.3F));
    });
}

void space()
{
    repeated("planes", [](Digest& digest, Random& random) {
        const auto a = some<KpVec3f>(random), b = some<KpVec3f>(random), c = some<KpVec3f>(random);
        KpPlane plane(a, b, c);
        const KpPlane other(b, c);
        KpLine line(a, b), cut;
        KpVec3f hit, on, onOther, barycentric;
        bool isFront = false;
        float t = 0, min = 0, max = 0;
        const KpBox3f box(-1, 1, -0.5F, 1.5F, -1, 2);
        plane.getDistance(box, min, max);
        digest.take(plane.intersect(line, hit, &t), hit, t, plane.intersect(other, cut), cut.position(),
                    cut.direction(), plane.getProjectedPoint(c + a), min, max);
        plane.transform(KpMat4f(turned(random).toMat3f()));
        digest.take(plane.normal(), plane.distance(), line.getClosestPoint(c));
        digest.take(line.getClosestPoints(KpLine(c, a + b), on, onOther), on, onOther);
        digest.take(line.intersect(box, on, onOther, 0.1F), on, onOther, line.intersect(0.2F, box));
        digest.take(line.intersect(b + c, c, a - c, hit, barycentric, isFront), hit, barycentric, isFront);
        digest.take(KpSphere(a, 1.5F).intersect(KpLine(b, c), on, onOther), on, onOther);
    });
    repeated("viewVolumes", [](Digest& digest, Random& random) {
        KpViewVolume volume = view(random);
        const auto world = some<KpVec3f>(random);
        const KpVec2f point(0.3F, 0.6F);
        KpMat4f affine, projection;
        KpVec3f near, far, screen;
        volume.getMatrices(affine, projection);
        volume.projectPointToLine(point, near, far);
        volume.projectToScreen(world, screen);
        const KpBox3f box(-1, 1, -0.5F, 1.5F, -1, 2);
        digest.take(affine, projection, volume.getMatrix(), volume.getCameraSpaceMatrix(), near, far, screen);
        digest.take(volume.projectBox(box), volume.getPlane(2).normal(), volume.getPlanePoint(2, point),
                    volume.getAlignRotation(false), volume.getWorldToScreenScale(world, 0.1F), volume.intersect(world),
                    volume.intersect(box), volume.narrow(0.2F, 0.3F, 0.7F, 0.9F).getMatrix(),
                    volume.zNarrow(0.8F, 0.2F).getMatrix());
        volume.transform(KpMat4f(turned(random).toMat3f()));
        volume.scale(1.25F);
        KpSphereSheetProjector projector(KpSphere(KpVec3f(0, 0, 0), 1), true);
        projector.setViewVolume(volume);
        KpRotation rotation;
        projector.projectAndGetRotation(point, rotation);
        digest.take(volume.getMatrix(), projector.projectAndGetRotation({0.5F, 0.4F}, rotation), rotation);
    });
    repeated("cutBoxes", [](Digest& digest, Random& random) {
        const KpBox3f box(-1, 1, -0.5F, 1.5F, -1, 2), other(0, 1, 0, 1, 0, 1);
        const auto normal = some<KpVec3f>(random), point = some<KpVec3f>(random);
        const KpPlane plane(normal, point);
        KpVec3f vertices[6], seconds[6];
        const int n = KpCutBoxPlane::cutPlane(box, other, plane, vertices, seconds);
        const auto count = static_cast<std::size_t>(n);
        digest.take(n, std::span(vertices).first(count), std::span(seconds).first(count));
        digest.take(KpCutBoxPlane::cutPlane(box, plane));
    });
    repeated("coordinateSystems", [](Digest& digest, Random& random) {
        const auto a = some<KpVec3f>(random), b = some<KpVec3f>(random), c = some<KpVec3f>(random);
        const auto origin = some<KpVec3f>(random);
        KpCoordinateSystem system(origin, {a, b, c});
        digest.take(system.asTransformation(), system.isValid(), system.isRightHanded());
        system.makePerpendicular(static_cast<int>(random() % 3), true);
        digest.take(system.asTransformation());
        system.setAxes(a, b);
        digest.take(system.asTransformation(), system.orientationAsQuaternion());
        system.setSystemByPlane(KpPlane(b, c));
        digest.take(system.asTransformation());
    });
}

void shapes()
{
    repeated("shapes", [](Digest& digest, Random& random) {
        const auto a = some<KpVec2f>(random), b = some<KpVec2f>(random), c = some<KpVec2f>(random);
        const KpLine2D line(a, b);
        KpVec2f hit(0, 0);
        digest.take(line.getDistanceTo(c), line.getClosestPoint(c, true), line.intersects(KpLine2D(c, a - b), &hit),
                    hit);
        const Ellipse2D ellipse = Ellipse2D::span(a, b);
        const Circle2D circle(a, 1.5F);
        const Polygon2D polygon({a, b, c, some<KpVec2f>(random)});
        const auto bounds = ellipse.boundingBox();
        digest.take(ellipse.tesselate(13), ellipse.closestPoint(c).second, ellipse.area(), ellipse.circumference());
        digest.take(circle.closestPoint(c).second, bounds.getUpperLeft(), bounds.getLowerRight());
        digest.take(polygon.contains({0.1F, 0.2F}), polygon.closestPoint(c).second, polygon.length());
        digest.take(Angle2D({a, b, c}).angle().second);
    });
}

}  // namespace

void digestsOfGeometry()
{
    matrices();
    space();
    shapes();
}

}  // namespace kplib::test
