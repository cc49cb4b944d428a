#include "SomeVectors.h"

#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpLine.h>

#include <gtest/gtest.h>

namespace {

const KpLine alongX(origin, x);

double determinant(const KpVec3d& a, const KpVec3d& b, const KpVec3d& c)
{
    return a.cross(b).dot(c);
}

TEST(KpLine, withoutLengthIsNaNOrKeepsItsZero)
{
    KpLine line(x, x);
    EXPECT_TRUE(isNaN(line.position()) && isNaN(line.direction()));
    EXPECT_EQ(line.setPosDir(x, origin), 0);
    EXPECT_EQ(line.direction(), origin);
    EXPECT_EQ(line.setPosDir(x, x * 4), 4);
    EXPECT_EQ(line, KpLine(x, x * 2));
}

TEST(KpLine, hasClosestPoints)
{
    std::mt19937 random(1);
    for (int i = 0; i < 3000; ++i) {
        const KpLine a(someVector(random, 10), someVector(random, 10)),
            b(someVector(random, 10), someVector(random, 10));
        const KpVec3d d1(a.direction()), d2(b.direction()), across = d1.cross(d2);
        const KpVec3d gap(KpVec3d(b.position()) - KpVec3d(a.position()));
        const double squaredSine = across.squaredLength();
        const KpVec3d onA = KpVec3d(a.position()) + d1 * (determinant(gap, d2, across) / squaredSine);
        const KpVec3d onB = KpVec3d(b.position()) + d2 * (determinant(gap, d1, across) / squaredSine);
        KpVec3f onThis, onOther;
        ASSERT_TRUE(a.getClosestPoints(b, onThis, onOther));
        // Products of lengths up to 17 round to about 20 of 2^-24, the parameter (up to 35 / sine) with its divisor.
        const double bound = 4e-5 / squaredSine + 6e-5 / std::pow(squaredSine, 1.5);
        EXPECT_LE(distance(onThis, onA), bound);
        EXPECT_LE(distance(onOther, onB), bound);
        EXPECT_NEAR((onThis - a.getClosestPoint(onOther)).length(), 0, bound);
    }
    KpVec3f onThis, onOther;
    EXPECT_FALSE(alongX.getClosestPoints(KpLine({0, 1, 0}, {-1, 1, 0}), onThis, onOther));
    EXPECT_TRUE(isNaN(onThis) && isNaN(onOther));
}

TEST(KpLine, goesThroughBoxes)
{
    std::mt19937 random(2);
    int hits = 0;
    for (int i = 0; i < 3000; ++i) {
        const KpLine line(someVector(random, 10), someVector(random, 3));
        const KpVec3f min = someVector(random, 4) - KpVec3f(4, 4, 4), max = someVector(random, 3) + KpVec3f(4, 4, 4);
        double entry = -1e38, exit = 1e38, slowest = 1;
        for (int axis = 0; axis < 3; ++axis) {
            const double direction = line.direction()[axis], position = line.position()[axis];
            const auto [low, high] =
                std::minmax({(min[axis] - position) / direction, (max[axis] - position) / direction});
            entry = std::max(entry, low);
            exit = std::min(exit, high);
            slowest = std::min(slowest, std::abs(direction));
        }
        if (std::abs(exit - entry) * slowest < 1e-3)  // may go either way
            continue;
        KpVec3f first, last;
        ASSERT_EQ(line.intersect(KpBox3f(min, max), first, last, 1e-4F), entry < exit);
        if (entry < exit) {
            ++hits;
            const KpVec3d position(line.position()), direction(line.direction());
            EXPECT_LE(distance(first, position + direction * entry), 1e-5);  // some 4 of 2^-24 of 30
            EXPECT_LE(distance(last, position + direction * exit), 1e-5);
        } else {
            EXPECT_TRUE(isNaN(first) && isNaN(last));
        }
    }
    EXPECT_GT(hits, 500);
}

TEST(KpLine, meetsBoxesAtTheirEdges)
{
    enum Outputs { Nan, Untouched, Points };
    const KpBox3f box(1, 3, -1, 1, -1, 1);
    const struct {
        const char* what;
        KpBox3f box;
        KpVec3f position, direction;
        float tolerance;
        Outputs outputs;
    } cases[] = {
        {"along x", box, {9, 0, 0}, x, 0, Points},
        {"in a face", box, {0, 1, 0}, x, 0, Points},
        {"beside a face, within the tolerance", box, {0, 1.25F, 0}, x, 0.5F, Points},
        {"beside a face", box, {0, 1.25F, 0}, x, 0.125F, Nan},
        {"thinner than the tolerance", box, origin, x, 2.5F, Untouched},
        {"thin, before y tells of the miss", box, {0, 9, 0}, x, 2.5F, Untouched},
        {"as thick as the tolerance", box, {0, 0, 0}, x, 2, Points},
        {"a slope that counts as parallel", box, {0, 0, 0}, {1, 9e-7F, 0}, 1e-5F, Points},
        {"empty", {3, 1, -1, 1, -1, 1}, origin, x, 9, Nan},
        {"no direction, inside", box, {2, 0, 0}, origin, 0, Points},
        {"not a number", box, {0, NaN, 0}, x, 0, Nan},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        KpLine line;
        line.setPosDir(c.position, c.direction);
        KpVec3f enter = untouched, exit = untouched;
        EXPECT_EQ(line.intersect(c.box, enter, exit, c.tolerance), c.outputs != Nan);
        if (c.outputs == Nan) {
            EXPECT_TRUE(isNaN(enter) && isNaN(exit));
        } else {
            const bool moves = c.direction.x() != 0;
            EXPECT_EQ(enter.x(), c.outputs == Untouched ? untouched.x() : moves ? 1 : 2);
            EXPECT_EQ(exit.x(), c.outputs == Untouched ? untouched.x() : moves ? 3 : 2);
        }
    }
}

TEST(KpLine, picksWhatIsNearerThanAnAngleOrARadius)
{
    const KpBox3f box(2, 3, 1, 2, -1, 1);
    const KpVec3f point(2, 1, 0), below(4, 1, -5), above(4, 1, 5), end(4, 1, 3);
    const struct {
        float angle;
        bool box, point, segment, end;  // `end` runs from there on away from the line
    } cases[] = {
        {-1.5F, true, true, true, false}, {-1, true, false, false, false},  {-0.5F, false, false, false, false},
        {0.6F, true, true, true, false},  {0.3F, true, false, true, false}, {0.2F, false, false, false, false},
        {0, false, false, false, false},  {-3.5F, true, true, true, true},  {0.9F, true, true, true, true},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.angle);
        KpVec3f out;
        EXPECT_EQ(alongX.intersect(c.angle, box), c.box);
        EXPECT_EQ(alongX.intersect(c.angle, point), c.point);
        EXPECT_EQ(alongX.intersect(c.angle, below, above, out), c.segment);
        EXPECT_TRUE(c.segment ? out == KpVec3f(4, 1, 0) : isNaN(out));
        EXPECT_EQ(alongX.intersect(c.angle, end, above, out), c.end);
        EXPECT_TRUE(c.end ? out == end : isNaN(out));
        EXPECT_EQ(alongX.intersect(c.angle, above, end, out), c.end);
    }
    KpVec3f out;
    EXPECT_TRUE(alongX.intersect(0, KpBox3f(2, 3, -1, 1, -1, 1))) << "angle 0, and the line crosses";
    EXPECT_FALSE(alongX.intersect(-9, KpBox3f(3, 2, -1, 1, -1, 1))) << "empty";
    for (const KpVec3f& behind : {origin, -x})
        EXPECT_FALSE(alongX.intersect(-9, behind));
    EXPECT_FALSE(alongX.intersect(-9, {0, 1, 0}, {5, 1, 0}, out)) << "parallel";
    EXPECT_FALSE(alongX.intersect(-9, point, point, out)) << "without length";
    for (float t = 1; t < 100; ++t)
        EXPECT_TRUE(KpLine(origin, {0.1F, 0.7F, 0.3F}).intersect(1e-3F, KpVec3f(0.1F, 0.7F, 0.3F) * t)) << t;
}

// Small whole numbers bring edges along axes, normals that tie between axes and lines through edges and corners.
TEST(KpLine, goesThroughTriangles)
{
    std::mt19937 random(3);
    std::uniform_int_distribution<int> numbers(-3, 3);
    const auto corner = [&] { return KpVec3f(numbers(random), numbers(random), numbers(random)); };
    int hits = 0;
    for (int i = 0; i < 20000; ++i) {
        const KpVec3f a = corner(), b = corner(), c = corner();
        const KpLine line(corner() + someVector(random, 0.3F), corner());
        const KpVec3d e(b - a), f(c - a), g(line.position() - a), d(line.direction());
        const double volume = determinant(e, f, d);
        KpVec3f hit, weights;
        bool front;
        const bool isHit = line.intersect(a, b, c, hit, weights, front);
        if (e.cross(f).length() == 0) {
            EXPECT_FALSE(isHit || front);
            EXPECT_TRUE(isNaN(hit) && isNaN(weights));
        }
        if (std::abs(volume) < 0.1)
            continue;
        const KpVec3d expected(1 - (determinant(g, f, d) + determinant(e, g, d)) / volume,
                               determinant(g, f, d) / volume, determinant(e, g, d) / volume);
        const double margin = std::min({expected.x(), expected.y(), expected.z()});
        if (std::abs(margin) < 1e-4)  // on an edge
            continue;
        ASSERT_EQ(isHit, margin > 0);
        if (isHit) {
            ++hits;
            EXPECT_LE(distance(weights, expected), 1e-4);  // 2^-24 times numbers up to 9^2, over 0.1
            EXPECT_LE(distance(hit, KpVec3d(a) + e * expected.y() + f * expected.z()), 1e-4);
            EXPECT_EQ(front, volume > 0);
        }
    }
    EXPECT_GT(hits, 1000);
    KpVec3f hit, weights;
    bool front;
    EXPECT_TRUE(KpLine({1, 0, -1}, {1, 0, -2}).intersect(origin, {2, 0, 0}, {0, 2, 0}, hit, weights, front));
    EXPECT_EQ(weights, KpVec3f(0.5F, 0.5F, 0)) << "an edge belongs to it";
    EXPECT_FALSE(alongX.intersect(origin, x, {0, 1, 0}, hit, weights, front)) << "in its plane";
}

}  // namespace
