#include "SomeVectors.h"

#include <kplib/geometry/KpCutBoxPlane.h>
#include <kplib/geometry/KpCutBoxPlaneDouble.h>
#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/detail/CutBox.h>

#include <gtest/gtest.h>

#include <bit>
#include <set>
#include <vector>

using namespace kplib::test;

namespace {

using Polygon = std::vector<KpVec3d>;

const KpBox3f unit(0, 1, 0, 1, 0, 1);

// The edges that the plane divides, sorted by the angle at which they are seen from the middle.
Polygon reference(const KpBox3f& box, const KpVec3d& normal, double distance)
{
    Polygon vertices;
    KpVec3d middle(0, 0, 0);
    for (int b = 0; b < 8; ++b)
        for (const int a : {b | 1, b | 2, b | 4}) {
            const KpVec3d from(box.corner(b)), to(box.corner(a));
            const double t = (distance - from.dot(normal)) / (to - from).dot(normal);
            if (a != b && t > 0 && t < 1)
                middle += vertices.emplace_back(from + (to - from) * t);
        }
    middle /= static_cast<double>(vertices.size());
    const KpVec3d u = (vertices.empty() ? middle : vertices[0]) - middle, v = normal.cross(u) / normal.length();
    const auto angle = [&](const KpVec3d& p) { return std::atan2((p - middle).dot(v), (p - middle).dot(u)); };
    std::sort(vertices.begin(), vertices.end(), [&](auto& p, auto& q) { return angle(p) < angle(q); });
    return vertices;
}

// Whether the two are one polygon, from whichever vertex and whichever way round.
bool isSame(Polygon a, const Polygon& b, double tolerance)
{
    const auto isNear = [&](const KpVec3d& p, const KpVec3d& q) { return (p - q).length() <= tolerance; };
    for (std::size_t turn = 0; turn < 2 * a.size(); ++turn) {
        if (std::equal(a.begin(), a.end(), b.begin(), b.end(), isNear))
            return true;
        std::rotate(a.begin(), a.begin() + 1, a.end());
        if (turn + 1 == a.size())
            std::reverse(a.begin(), a.end());
    }
    return a.empty() && b.empty();
}

template <typename Vector>
Polygon polygon(const Vector* vertices, int count)
{
    return Polygon(vertices, vertices + count);
}

TEST(CutBoxTable, holdsEachDividedEdgeOnce)
{
    int rows[7] = {};
    for (int mask = 0; mask < 128; ++mask) {
        const std::uint8_t* row = kplib::detail::cuts[mask];
        ++rows[row[0]];
        const std::set<int> edges(row + 1, row + 1 + row[0]);
        EXPECT_EQ(edges.size(), row[0]) << mask;
        for (const int edge : edges) {
            const unsigned a = edge >> 4, b = edge & 15;
            EXPECT_TRUE(b < a && a < 8 && std::has_single_bit(a ^ b)) << mask;
            EXPECT_NE(mask >> a & 1, mask >> b & 1) << mask;
        }
    }
    const int expected[] = {49, 0, 0, 8, 15, 24, 32};
    EXPECT_TRUE(std::equal(rows, rows + 7, expected));
}

TEST(KpCutBoxPlane, cutsThePolygonThatTheEdgesGive)
{
    std::mt19937 random(1);
    std::uniform_real_distribution<float> components(-1, 1), sizes(1, 5);
    std::set<unsigned> divisions;
    for (int i = 0; i < 20000; ++i) {
        const KpVec3f min = someVector(random, 5), size(sizes(random), sizes(random), sizes(random));
        const KpBox3f box(min, min + size);
        KpVec3f normal = someVector(random, 1);
        for (float& component : normal)
            component = std::abs(component) < 0.2F ? 0 : component;  // along axes too
        const float distance = normal.dot(min + size / 2) + components(random) * normal.length() * size.length() / 2;
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
        const Polygon expected = reference(box, KpVec3d(normal), distance);

        // Values round to 4 of 2^-24 of 18, which is divided by at least 0.2 an edge.
        const double bound = 5e-5;
        KpVec3f vertices[6], inUnit[6];
        const KpCutBoxPlane cutter(box, unit, normal);
        const int count = cutter.cutPlane(distance, vertices, inUnit);
        ASSERT_TRUE(isSame(polygon(vertices, count), expected, bound)) << "mask " << mask;
        for (int k = 0; k < count; ++k)
            EXPECT_LE((min + inUnit[k] * size - vertices[k]).length(), 1e-5);
        const std::vector<KpVec3f> asVector = cutter.cutPlane(distance);
        ASSERT_TRUE(isSame(polygon(asVector.data(), static_cast<int>(asVector.size())), expected, bound));

        double bounds[6];
        std::copy_n(box.data(), 6, bounds);
        KpVec3d inDouble[6], alsoInDouble[6];
        const KpCutBoxPlaneDouble cutterDouble(bounds, bounds, KpVec3d(normal));
        const int countDouble = cutterDouble.cutPlane(distance, inDouble, alsoInDouble);
        ASSERT_TRUE(isSame(polygon(inDouble, countDouble), expected, 1e-12));
        EXPECT_TRUE(std::equal(inDouble, inDouble + countDouble, alsoInDouble));
    }
    EXPECT_EQ(divisions.size(), 52U);  // of the 104 threshold functions of three variables, each and its complement
}

TEST(KpCutBoxPlane, countsCornersInThePlaneAsAbove)
{
    const struct {
        KpVec3f normal;
        float distance;
        std::size_t count;
    } cases[] = {
        {{1, 0, 0}, 0.5F, 4}, {{1, 0, 0}, 1, 4}, {{1, 0, 0}, 0, 0}, {{1, 0, 0}, 2, 0}, {{1, 0, 0}, -1, 0},
        {{1, 1, 1}, 1.5F, 6}, {{1, 1, 1}, 1, 3}, {{1, 1, 1}, 0, 0}, {{1, 1, 1}, 3, 3}, {{1, 1, 1}, NaN, 0},
    };
    for (const auto& c : cases) {
        const std::vector<KpVec3f> vertices = KpCutBoxPlane(unit, c.normal).cutPlane(c.distance);
        EXPECT_EQ(vertices.size(), c.count) << c.normal << c.distance;
        for (const KpVec3f& v : vertices)
            EXPECT_EQ(v.dot(c.normal), c.distance);
    }
}

TEST(KpCutBoxPlane, isMadeInManyWays)
{
    const KpVec3f min(0, 0, 0), max(1, 1, 1);
    const KpPlane plane(x, 0.5F);
    KpVec3f first[6], second[6];
    KpVec3d inDouble[6];
    const int count = KpCutBoxPlane::cutPlane(KpBox3f(-1, 2, 0, 2, 1, 2), unit, plane, first, second);
    const int countDouble = KpCutBoxPlaneDouble().cutPlane(0.5, inDouble);
    const Polygon expected = {{0.5, 0, 0}, {0.5, 0, 1}, {0.5, 1, 1}, {0.5, 1, 0}};
    EXPECT_TRUE(isSame(polygon(second, count), expected, 0));
    EXPECT_TRUE(isSame(polygon(inDouble, countDouble), expected, 0));
    for (const auto& vertices : {KpCutBoxPlane().cutPlane(0.5F), KpCutBoxPlane(min, max, x).cutPlane(0.5F),
                                 KpCutBoxPlane::cutPlane(unit, plane), KpCutBoxPlane::cutPlane(min, max, plane)})
        EXPECT_TRUE(isSame(polygon(vertices.data(), static_cast<int>(vertices.size())), expected, 0));

    ASSERT_EQ(KpCutBoxPlane(KpBox3f(0, 8e-9F, 0, 1, 0, 1), x).cutPlane(1e-9F, first, nullptr), 4);
    EXPECT_EQ(first[0].x(), 4e-9F) << "edges too short to divide by are cut in the middle";
}

}  // namespace
