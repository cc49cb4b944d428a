#include "SomeVectors.h"

#include <kplib/geometry/KpLine.h>
#include <kplib/geometry/KpSphere.h>

#include <gtest/gtest.h>

namespace {

TEST(KpSphere, isHitByLinesAndSegments)
{
    const KpSphere sphere({0, 0, 5}, 2);
    const auto at = [](float along, float aside) { return KpVec3f(aside, 0, along); };
    const struct {
        const char* what;
        float p0, p1, aside;
        bool first, both;
        float nearest, enter, exit;  // along z
        float segmentEnter, segmentExit;
    } cases[] = {
        {"through all of it", 0, 9, 0, true, true, 3, 3, 7, 3, 7},
        {"from inside", 6, 20, 0, true, true, 7, 3, 7, 6, 7},
        {"behind the position", 8, 9, 0, false, true, 0, 3, 7, 8, 8},
        {"the segment ends before it", 0, 1, 0, true, true, 3, 3, 7, 1, 1},
        {"backwards", 9, 4, 0, true, true, 7, 7, 3, 7, 4},
        {"tangent", 0, 9, 2, true, true, 5, 5, 5, 5, 5},
        {"beside it", 0, 9, 2.1F, false, false, 0, 0, 0, 0, 0},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        const KpVec3f p0 = at(c.p0, c.aside), p1 = at(c.p1, c.aside);
        KpVec3f out = untouched, enter = untouched, exit = untouched;
        EXPECT_EQ(sphere.intersect(KpLine(p0, p1), out), c.first);
        EXPECT_EQ(out, c.first ? at(c.nearest, c.aside) : untouched);
        for (const bool segment : {false, true}) {
            EXPECT_EQ(segment ? sphere.intersect(p0, p1, enter, exit) : sphere.intersect(KpLine(p0, p1), enter, exit),
                      c.both);
            if (c.both) {
                EXPECT_EQ(enter, at(segment ? c.segmentEnter : c.enter, c.aside));
                EXPECT_EQ(exit, at(segment ? c.segmentExit : c.exit, c.aside));
            } else {
                EXPECT_TRUE(isNaN(enter) && isNaN(exit));
            }
        }
    }
    EXPECT_EQ(KpSphere::emptySphere(), KpSphere({0, 0, 0}, -1));
    EXPECT_EQ(&KpSphere::emptySphere(), &KpSphere::emptySphere());
}

}  // namespace
