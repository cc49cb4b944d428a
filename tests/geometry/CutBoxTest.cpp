#include "SomeVectors.h"

#include <kplib/geometry/KpCutBoxPlane.h>
#include <kplib/geometry/KpCutBoxPlaneDouble.h>
#include <kplib/geometry/KpPlane.h>

#include <bit>
#include <set>
#include <utility>

using namespace kplib::test;

namespace {

const KpBox3f unit(0, 1, 0, 1, 0, 1);

// Whether the vertices are in the plane, one on each edge that it divides, and neighbours on one face of the box.
template <typename Vector>
bool isCut(const Vector* vertices, std::size_t count, const KpBox3f& box, unsigned mask, const KpPlane& plane,
           double bound)
{
    std::vector<unsigned> edges;  // the two faces of each
    for (std::size_t i = 0; i < count; ++i) {
        const KpVec3d v(vertices[i]);
        unsigned& faces = edges.emplace_back(0);
        for (int k = 0; k < 6; ++k)
            faces |= (std::abs(v[k / 2] - static_cast<double>(box[k])) <= bound ? 1U : 0U) << k;
        if (std::popcount(faces) != 2 || std::abs(v.dot(KpVec3d(plane.normal())) - plane.distance()) > bound)
            return false;
    }
    for (std::size_t i = 0; i < count; ++i) {
        if (!(edges[i] & edges[(i + 1) % count]))
            return false;
    }
    const unsigned divided[] = {(mask ^ mask >> 1) & 0x55, (mask ^ mask >> 2) & 0x33, (mask ^ mask >> 4) & 0x0F};
    const int expected = std::popcount(divided[0]) + std::popcount(divided[1]) + std::popcount(divided[2]);
    return std::cmp_equal(count, expected) && std::set(edges.begin(), edges.end()).size() == count;
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
        normal.normalize();
        const KpPlane plane(normal, normal.dot(min + size / 2) + someNumber(random, -0.5F, 0.5F) * size.length());
        double nearest = 1;
        unsigned mask = 0;
        for (int k = 0; k < 8; ++k) {
            const double above = KpVec3d(box.corner(k)).dot(KpVec3d(plane.normal())) - plane.distance();
            nearest = std::min(nearest, std::abs(above));
            mask |= (above < 0 ? 1U : 0U) << k;
        }
        if (nearest < 1e-3)  // may go either way
            continue;
        divisions.insert(std::min(mask, mask ^ 255));

        // Values round to 4 of 2^-24 of 18, which is divided by at least 0.1 an edge.
        KpVec3f vertices[6], inUnit[6];
        const int count = KpCutBoxPlane::cutPlane(box, unit, plane, vertices, inUnit);
        ASSERT_TRUE(isCut(vertices, count, box, mask, plane, 5e-5)) << "mask " << mask;
        for (int k = 0; k < count; ++k)
            EXPECT_LE((min + inUnit[k] * size - vertices[k]).length(), 1e-5);

        double bounds[6];
        std::copy_n(box.data(), 6, bounds);
        KpVec3d inDouble[6], alsoInDouble[6];
        const KpCutBoxPlaneDouble cutter(bounds, bounds, KpVec3d(plane.normal()));
        const int countDouble = cutter.cutPlane(plane.distance(), inDouble, alsoInDouble);
        ASSERT_TRUE(isCut(inDouble, countDouble, box, mask, plane, 1e-12)) << "mask " << mask;
        EXPECT_TRUE(std::equal(inDouble, inDouble + count, alsoInDouble));
    }
    EXPECT_EQ(divisions.size(), 52U);  // of the 104 threshold functions of three variables, each and its complement
}

TEST(KpCutBoxPlane, countsCornersInThePlaneAsAbove)
{
    const std::tuple<KpVec3f, float, std::size_t> cases[] = {
        {x, 1, 4}, {x, 0, 0}, {x, -1, 0}, {-x, 0, 4}, {{1, 1, 1}, 1, 3}, {{1, 1, 1}, 3, 3}, {x, NaN, 0}};
    for (const auto& [normal, distance, count] : cases) {
        const std::vector<KpVec3f> vertices = KpCutBoxPlane(unit, normal).cutPlane(distance);
        EXPECT_EQ(vertices.size(), count) << normal << distance;
        for (const KpVec3f& v : vertices)
            EXPECT_EQ(v.dot(normal), distance);
    }
    KpVec3f vertices[6];
    KpVec3d inDouble[6];
    EXPECT_EQ(KpCutBoxPlane().cutPlane(0.5F), KpCutBoxPlane::cutPlane(unit, KpPlane(x, 0.5F)));
    EXPECT_EQ(KpCutBoxPlaneDouble().cutPlane(0.5, inDouble), 4);
    EXPECT_EQ(inDouble[1].x(), 0.5);
    ASSERT_EQ(KpCutBoxPlane(KpBox3f(0, 8e-9F, 0, 1, 0, 1), x).cutPlane(1e-9F, vertices, nullptr), 4);
    EXPECT_EQ(vertices[0].x(), 4e-9F) << "edges too short to divide by are cut in the middle";
}
