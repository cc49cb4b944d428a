#include "SomeVectors.h"

#include <kplib/geometry/KpLine.h>
#include <kplib/geometry/KpSphere.h>

using namespace kplib::test;

namespace {

TEST(KpSphere, isHitByLinesAndSegments)
{
    const KpSphere sphere({0, 0, 5}, 2);
    const auto at = [](float along, float aside) { return KpVec3f(aside, 0, along); };
    // Two points of a line and how far it is from the axis, then what is hit: all along z, NaN for none.
    const std::tuple<const char*, float, float, float, float, float, float, float, float> cases[] = {
        {"from inside", 6, 20, 0, 7, 3, 7, 6, 7},
        {"behind the position", 8, 9, 0, NaN, 3, 7, 8, 8},
        {"the segment ends before it", 0, 1, 0, 3, 3, 7, 1, 1},
        {"backwards", 9, 4, 0, 7, 7, 3, 7, 4},
        {"tangent", 0, 9, 2, 5, 5, 5, 5, 5},
        {"beside it", 0, 9, 2.1F, NaN, NaN, NaN, NaN, NaN},
    };
    for (const auto& [what, from, to, aside, zFirst, zEnter, zExit, zSegmentEnter, zSegmentExit] : cases) {
        SCOPED_TRACE(what);
        const KpVec3f p0 = at(from, aside), p1 = at(to, aside);
        KpVec3f first = untouched, enter, exit, segmentEnter, segmentExit;
        EXPECT_EQ(sphere.intersect(KpLine(p0, p1), first), !std::isnan(zFirst));
        EXPECT_EQ(first, std::isnan(zFirst) ? untouched : at(zFirst, aside));
        const bool isHit = sphere.intersect(KpLine(p0, p1), enter, exit);
        EXPECT_EQ(isHit, !std::isnan(zEnter));
        EXPECT_EQ(sphere.intersect(p0, p1, segmentEnter, segmentExit), isHit);
        EXPECT_TRUE(isHit ? enter == at(zEnter, aside) && exit == at(zExit, aside) : isNaN(enter) && isNaN(exit));
        EXPECT_TRUE(isHit ? segmentEnter == at(zSegmentEnter, aside) && segmentExit == at(zSegmentExit, aside)
                          : isNaN(segmentEnter) && isNaN(segmentExit));
    }
}

}  // namespace
