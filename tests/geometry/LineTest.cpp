#include "SomeVectors.h"

#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpLine.h>

using namespace kplib::test;

namespace {

const KpLine alongX(origin, x);

double determinant(const KpVec3d& a, const KpVec3d& b, const KpVec3d& c)
{
    return a.cross(b).dot(c);
}

TEST(KpLine, withoutLengthIsNaNOrKeepsItsZero)
{
    KpLine line(x, x);
    EXPECT_EQ(std::tuple(isNaN(line.position()), isNaN(line.direction())), std::tuple(true, true));
    EXPECT_EQ(line.setPosDir(x, origin), 0);
    EXPECT_EQ(line.direction(), origin);
    EXPECT_EQ(line.setPosDir(x, x * 4), 4);
    EXPECT_EQ(line, KpLine(x, x * 2));
}

TEST(KpLine, hasClosestPoints)
{
    std::mt19937 random(1);
    const auto someLine = [&] { return KpLine{someVector(random, 10), someVector(random, 10)}; };
    KpVec3f onThis, onOther;
    for (int i = 0; i < 3000; ++i) {
        const KpLine a = someLine(), b = someLine();
        const KpVec3d d1(a.direction()), d2(b.direction()), p1(a.position()), p2(b.position()), across = d1.cross(d2);
        const double sine = across.length();
        ASSERT_TRUE(a.getClosestPoints(b, onThis, onOther));
        // Products of lengths up to 17 round to about 20 of 2^-24, the parameter (up to 35 / sine) with its divisor.
        const double bound = 4e-5 / std::pow(sine, 2) + 6e-5 / std::pow(sine, 3);
        EXPECT_LE(distance(onThis, p1 + d1 * (determinant(p2 - p1, d2, across) / sine / sine)), bound);
        EXPECT_LE(distance(onOther, p2 + d2 * (determinant(p2 - p1, d1, across) / sine / sine)), bound);
        EXPECT_LE((onThis - a.getClosestPoint(onOther)).length(), bound);
    }
    EXPECT_FALSE(alongX.getClosestPoints(KpLine(y, y - x), onThis, onOther));
    EXPECT_EQ(std::tuple(isNaN(onThis), isNaN(onOther)), std::tuple(true, true));
}

TEST(KpLine, goesThroughBoxes)
{
    std::mt19937 random(2);
    int hits = 0;
    for (int i = 0; i < 3000; ++i) {
        const KpLine line(someVector(random, 10), someVector(random, 3));
        const KpVec3f min = someVector(random, 4) - KpVec3f(4, 4, 4), max = someVector(random, 3) + KpVec3f(4, 4, 4);
        const KpVec3d d(line.direction()), p(line.position());
        double entry = -1e38, exit = 1e38, slowest = 1;
        for (int axis = 0; axis < 3; ++axis) {
            const auto [in, out] = std::minmax({(min[axis] - p[axis]) / d[axis], (max[axis] - p[axis]) / d[axis]});
            entry = std::max(entry, in);
            exit = std::min(exit, out);
            slowest = std::min(slowest, std::abs(d[axis]));
        }
        if (std::abs(exit - entry) * slowest < 1e-3)  // may go either way
            continue;
        KpVec3f first, last;
        ASSERT_EQ(line.intersect(KpBox3f(min, max), first, last, 1e-4F), entry < exit);
        hits += entry < exit;
        // Some 4 of 2^-24 of 30.
        EXPECT_TRUE(entry < exit ? distance(first, p + d * entry) < 1e-5 && distance(last, p + d * exit) < 1e-5
                                 : isNaN(first) && isNaN(last));
    }
    EXPECT_GT(hits, 500);
}

TEST(KpLine, meetsBoxesAtTheirEdges)
{
    const KpBox3f box(1, 3, -1, 1, -1, 1);
    // A box, position and direction of a line, the tolerance, x of both points; NaN is a miss.
    const std::tuple<const char*, KpBox3f, KpVec3f, KpVec3f, float, float, float> cases[] = {
        {"against x", box, {9, 0, 0}, -x, 0, 3, 1},
        {"in a face", box, y, x, 0, 1, 3},
        {"beside a face, within the tolerance", box, y * 1.25F, x, 0.5F, 1, 3},
        {"beside a face", box, y * 1.25F, x, 0.125F, NaN, NaN},
        {"thin, before y tells of a miss", box, y * 9, x, 2.5F, untouched.x(), untouched.x()},
        {"as thick as the tolerance", box, origin, x, 2, 1, 3},
        {"a slope that counts as parallel", box, origin, {1, 9e-7F, 0}, 1e-5F, 1, 3},
        {"empty", {3, 1, -1, 1, -1, 1}, origin, x, 9, NaN, NaN},
        {"no direction, inside", box, x * 2, origin, 0, 2, 2},
        {"not a number", box, {0, NaN, 0}, x, 0, NaN, NaN},
    };
    for (const auto& [what, target, position, direction, tolerance, enterX, exitX] : cases) {
        KpLine line;
        line.setPosDir(position, direction);
        KpVec3f enter = untouched, exit = untouched;
        const bool isHit = line.intersect(target, enter, exit, tolerance);
        EXPECT_EQ(isHit, !std::isnan(enterX)) << what;
        EXPECT_TRUE(isHit ? enter.x() == enterX && exit.x() == exitX : isNaN(enter) && isNaN(exit)) << what;
    }
}

TEST(KpLine, picksWhatIsNearerThanAnAngleOrARadius)
{
    const KpBox3f box(2, 3, 1, 2, -1, 1);
    const KpVec3f point(2, 1, 0), below(4, 1, -5), above(4, 1, 5), end(4, 1, 3);
    // What is hit: box, point, segment, and a segment that runs from `end` away from the line.
    const std::tuple<float, bool, bool, bool, bool> cases[] = {
        {-1.5F, true, true, true, false},   {-1, true, false, false, false}, {0.3F, true, false, true, false},
        {0.2F, false, false, false, false}, {-3.5F, true, true, true, true}, {0.9F, true, true, true, true},
    };
    KpVec3f out;
    for (const auto& [angle, hitsBox, hitsPoint, hitsSegment, hitsEnd] : cases) {
        SCOPED_TRACE(angle);
        EXPECT_EQ(alongX.intersect(angle, box), hitsBox);
        EXPECT_EQ(alongX.intersect(angle, point), hitsPoint);
        EXPECT_EQ(alongX.intersect(angle, below, above, out), hitsSegment);
        EXPECT_TRUE(hitsSegment ? out == KpVec3f(4, 1, 0) : isNaN(out));
        EXPECT_EQ(alongX.intersect(angle, above, end, out), hitsEnd);
        EXPECT_EQ(alongX.intersect(angle, end, above, out), hitsEnd);
        EXPECT_TRUE(hitsEnd ? out == end : isNaN(out));
    }
    EXPECT_TRUE(alongX.intersect(0, KpBox3f(2, 3, -1, 1, -1, 1))) << "angle 0, and the line crosses";
    EXPECT_FALSE(alongX.intersect(-9, KpBox3f(3, 2, -1, 1, -1, 1)) || alongX.intersect(-9, origin)) << "empty, behind";
    EXPECT_FALSE(alongX.intersect(-9, y, y + x, out) || alongX.intersect(-9, y, y, out)) << "parallel, no length";
    for (float t = 1; t < 100; ++t)  // on the line, whatever rounding leaves
        EXPECT_TRUE(KpLine(origin, {0.1F, 0.7F, 0.3F}).intersect(1e-3F, KpVec3f(0.1F, 0.7F, 0.3F) * t)) << t;
}

// Small whole numbers bring edges along axes and normals that tie between axes.
TEST(KpLine, goesThroughTriangles)
{
    std::mt19937 random(3);
    std::uniform_int_distribution<int> numbers(-3, 3);
    const auto corner = [&] { return KpVec3f(numbers(random), numbers(random), numbers(random)); };
    KpVec3f hit, weights;
    bool front;
    int hits = 0;
    for (int i = 0; i < 20000; ++i) {
        const KpVec3f a = corner(), b = corner(), c = corner();
        const KpLine line{corner() + someVector(random, 0.3F), corner()};
        const KpVec3d e(b - a), f(c - a), g(line.position() - a), d(line.direction());
        const double volume = determinant(e, f, d), ofB = determinant(g, f, d), ofC = determinant(e, g, d);
        const double margin = std::min({ofB / volume, ofC / volume, 1 - (ofB + ofC) / volume});
        const bool isFlat = e.cross(f).length() == 0;
        if (!isFlat && !(std::abs(volume) > 0.1 && std::abs(margin) > 1e-4))  // may go either way
            continue;
        const bool isHit = !isFlat && margin > 0;
        hits += isHit;
        ASSERT_EQ(line.intersect(a, b, c, hit, weights, front), isHit);
        EXPECT_EQ(front, isHit && volume > 0);
        // 2^-24 times numbers up to 9^2, over 0.1.
        EXPECT_TRUE(isHit ? distance(weights, KpVec3d(volume - ofB - ofC, ofB, ofC) / volume) < 1e-4 &&
                                distance(hit, KpVec3d(a) + (e * ofB + f * ofC) / volume) < 1e-4
                          : isNaN(hit) && isNaN(weights));
    }
    EXPECT_GT(hits, 1000);
    EXPECT_TRUE(KpLine(x, x - z).intersect(origin, x * 2, y * 2, hit, weights, front));
    EXPECT_EQ(weights, KpVec3f(0.5F, 0.5F, 0)) << "an edge belongs to it";
    EXPECT_FALSE(alongX.intersect(origin, x, y, hit, weights, front)) << "in its plane";
}

}  // namespace
