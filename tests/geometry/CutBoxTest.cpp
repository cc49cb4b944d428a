#include "SomeVectors.h"

#include <kplib/geometry/KpCutBoxPlane.h>
#include <kplib/geometry/KpCutBoxPlaneDouble.h>
#include <kplib/geometry/KpPlane.h>

#include <bit>
#include <set>

using namespace kplib::test;

namespace {

const KpBox3f unit(0, 1, 0, 1, 0, 1);

// Whether the vertices are in the plane, one on each edge that it divides, and neighbours on one face of the box.
template <typename Vector>
bool isCut(const Vector* vertices, std::size_t count, const KpBox3f& box, const KpVec3d& normal, double distance,
           double bound)
{
    std::vector<unsigned> edges;  // the two faces of each
    for (std::size_t i = 0; i < count; ++i) {
        const KpVec3d v(vertices[i]);
        unsigned& faces = edges.emplace_back(0);
        for (int k = 0; k < 6; ++k)
            faces |= (std::abs(v[k / 2] - static_cast<double>(box[k])) <= bound ? 1U : 0U) << k;
        if (std::popcount(faces) != 2 || std::abs(v.dot(normal) - distance) > bound)
            return false;
    }
    std::size_t divided = 0;
    const auto isBelow = [&](int i) { return KpVec3d(box.corner(i)).dot(normal) < distance; };
    for (int b = 0; b < 8; ++b) {
        for (const int a : {b | 1, b | 2, b | 4})
            divided += isBelow(a) != isBelow(b);
    }
    for (std::size_t i = 0; i < count; ++i) {
        if (!(edges[i] & edges[(i + 1) % count]))
            return false;
    }
    return count == divided && std::set(edges.begin(), edges.end()).size() == count;
}

}  // namespace

TEST(KpCutBoxPlane, cutsEachDividedEdgeInOrder)
{
    std::mt19937 random(1);
    std::set<unsigned> divisions;
    for (int i = 0; i < 20000; ++i) {
        const KpVec3f min = someVector(random, 5), size = someVector(random, 2) + KpVec3f(3, 3, 3);
        const KpBox3f box(min, min + size);
        KpVec3f normal = someVector(random, 1);
        for (float& component : normal)
            component = std::abs(component) < 0.2F ? 0 : component;  // along axes too
        const float reach = normal.length() * size.length() / 2;
        const float distance = normal.dot(min + size / 2) + someNumber(random, -1, 1) * reach;
        double nearest = 1;
        unsigned mask = 0;
        for (int k = 0; k < 8; ++k) {
            const double above = KpVec3d(box.corner(k)).dot(KpVec3d(normal)) - distance;
            nearest = std::min(nearest, std::abs(above));
            mask |= (above < 0 ? 1U : 0U) << k;
        }
        if (nearest < 1e-3)  // may go either way
            continue;
        divisions.insert(std::min(mask, mask ^ 255));
        const auto check = [&](const auto* vertices, std::size_t count, double bound) {
            ASSERT_TRUE(isCut(vertices, count, box, KpVec3d(normal), distance, bound)) << "mask " << mask;
        };
        // Values round to 4 of 2^-24 of 18, which is divided by at least 0.2 an edge.
        KpVec3f vertices[6], inUnit[6];
        const KpCutBoxPlane cutter(box, unit, normal);
        const int count = cutter.cutPlane(distance, vertices, inUnit);
        check(vertices, count, 5e-5);
        for (int k = 0; k < count; ++k)
            EXPECT_LE((min + inUnit[k] * size - vertices[k]).length(), 1e-5);
        const std::vector<KpVec3f> asVector = cutter.cutPlane(distance);
        check(asVector.data(), asVector.size(), 5e-5);

        double bounds[6];
        std::copy_n(box.data(), 6, bounds);
        KpVec3d inDouble[6], alsoInDouble[6];
        const KpCutBoxPlaneDouble cutterDouble(bounds, bounds, KpVec3d(normal));
        check(inDouble, cutterDouble.cutPlane(distance, inDouble, alsoInDouble), 1e-12);
        EXPECT_TRUE(std::equal(inDouble, inDouble + count, alsoInDouble));
    }
    EXPECT_EQ(divisions.size(), 52U);  // of the 104 threshold functions of three variables, each and its complement
}

TEST(KpCutBoxPlane, countsCornersInThePlaneAsAbove)
{
    const struct {
        KpVec3f normal;
        float distance;
        std::size_t count;
    } cases[] = {{x, 1, 4},  {x, 0, 0},         {x, 2, 0},         {x, -1, 0},        {{1, 1, 1}, 1.5F, 6},
                 {-x, 0, 4}, {{1, 1, 1}, 1, 3}, {{1, 1, 1}, 0, 0}, {{1, 1, 1}, 3, 3}, {{1, 1, 1}, NaN, 0}};
    for (const auto& c : cases) {
        const std::vector<KpVec3f> vertices = KpCutBoxPlane(unit, c.normal).cutPlane(c.distance);
        EXPECT_EQ(vertices.size(), c.count) << c.normal << c.distance;
        for (const KpVec3f& v : vertices)
            EXPECT_EQ(v.dot(c.normal), c.distance);
    }
    KpVec3f vertices[6];
    ASSERT_EQ(KpCutBoxPlane(KpBox3f(0, 8e-9F, 0, 1, 0, 1), x).cutPlane(1e-9F, vertices, nullptr), 4);
    EXPECT_EQ(vertices[0].x(), 4e-9F) << "edges too short to divide by are cut in the middle";
}

TEST(KpCutBoxPlane, isMadeInManyWays)
{
    const KpVec3f max(1, 1, 1);
    const KpPlane plane(x, 0.5F);
    KpVec3f first[6], second[6];
    KpVec3d inDouble[6];
    const int count = KpCutBoxPlane::cutPlane(KpBox3f(-1, 2, 0, 2, 1, 2), unit, plane, first, second);
    EXPECT_TRUE(isCut(second, count, unit, KpVec3d(x), 0.5, 0));
    EXPECT_TRUE(isCut(inDouble, KpCutBoxPlaneDouble().cutPlane(0.5, inDouble), unit, KpVec3d(x), 0.5, 0));
    for (const auto& v : {KpCutBoxPlane().cutPlane(0.5F), KpCutBoxPlane(origin, max, x).cutPlane(0.5F),
                          KpCutBoxPlane::cutPlane(unit, plane), KpCutBoxPlane::cutPlane(origin, max, plane)})
        EXPECT_TRUE(isCut(v.data(), v.size(), unit, KpVec3d(x), 0.5, 0));
}
