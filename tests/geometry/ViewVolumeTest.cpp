#include "SomeVectors.h"

#include <kplib/geometry/KpViewVolume.h>

using namespace kplib::test;

namespace {

using Volume = KpViewVolume;

// Both kinds by turns, a box off the axis; somewhere in the world.
Volume makeVolume(std::mt19937& random, int round)
{
    Volume volume;
    if (round % 2)
        volume.perspective(someNumber(random, 0.3F, 1.5F), someNumber(random, 0.5F, 2), 1.5F, someNumber(random, 4, 8));
    else
        volume.ortho(someNumber(random, -3, -1), 2, -2, someNumber(random, 1, 3), 1.5F, someNumber(random, 4, 8));
    volume.rotateCamera(KpRotation(someVector(random, 2), someNumber(random, -3, 3)));
    volume.translateCamera(someVector(random, 2));
    return volume;
}

KpVec3f toScreen(const Volume& volume, const KpVec3f& world)
{
    KpVec3f screen;
    volume.projectToScreen(world, screen);
    return screen;
}

// The point of the world at a place on the screen and a share, from 0 to 1, of the way from near to far.
KpVec3f toWorld(const Volume& volume, const KpVec3f& screen)
{
    KpVec3f near, far;
    volume.projectPointToLine(KpVec2f(screen.x(), screen.y()), near, far);
    return near + (far - near) * screen.z();
}

}  // namespace

TEST(KpViewVolume, takesTheWorldToTheScreenAndBack)
{
    std::mt19937 random(65);
    for (int round = 0; round < 100; ++round) {
        const Volume v = makeVolume(random, round);
        expectNear(toScreen(v, v.llf()), origin);
        expectNear(toScreen(v, v.lrf()), x);
        expectNear(toScreen(v, v.ulf()), y);
        expectNear(v.zVector(), -v.projDir());
        expectNear(v.getCameraSpaceMatrix().multVecMatrix(v.getSightPoint(3)), z * -3);
        const KpVec3f onFar(someNumber(random, 0, 1), someNumber(random, 0, 1), 1);
        const KpVec3f far = v.getPlanePoint(v.nearDist() + v.nearToFar(), KpVec2f(onFar.x(), onFar.y()));
        expectNear(toScreen(v, far), onFar);
        expectNear(toWorld(v, onFar), far);
        const KpVec3f width = v.lrf() - v.llf(), height = v.ulf() - v.llf();
        expectNear(v.getAlignRotation(false).multVec(y * height.length()), height);
        expectNear(v.getAlignRotation(false).multVec(x * width.length()), width, 1e-2F);
    }
    Volume v;
    v.ortho(-1, 1, -1, 1, 1, 3);
    expectNear(toScreen(v, z * -2), KpVec3f(0.5F, 0.5F, 0.5F));
    EXPECT_FLOAT_EQ(v.projectBox(KpBox3f(-0.5F, 0.5F, -0.25F, 0, -2, -1)).y(), 0.125F);
    v.frustum(-1, 2, -3, 4, 5, 7);
    EXPECT_EQ(std::tuple(v.llf(), v.nearToFar()), std::tuple(KpVec3f(-1, -3, 5), 2));
}

TEST(KpViewVolume, alignsByRightAngles)
{
    // In the last, that the turn of y counts twice keeps x from coming to the right.
    const std::pair<KpRotation, KpVec3f> cases[] = {
        {{y, 0.1F}, x}, {{y, 1.6F}, -z}, {{y, -1.6F}, z}, {{z, 3.1415927F}, x}};
    for (const auto& [turn, xTo] : cases) {
        Volume v;
        v.perspective(1, 1, 1, 2);
        v.rotateCamera(turn);
        expectNear(v.getAlignRotation(true).multVec(x), xTo);
        expectNear(v.getAlignRotation(true).multVec(y), turn * y);
    }
}

TEST(KpViewVolume, shiftsStereoEyesAgainstEachOther)
{
    // mode, offset (0: not set), shift to the right
    for (const KpVec3f& c : {KpVec3f(0, 5, 0), {1, 0, -0.21F}, {7, 0, 0.21F}, {1, 0.5F, 0.1875F}}) {
        Volume v;
        v.perspective(1.5707964F, 1, 2, 6);
        v.setStereoMode(static_cast<int>(c.x()));
        v.setStereoEyeScale(2);
        v.setStereoOffsetScale(3);
        if (c.y() != 0)
            v.setCameraOffset(c.y());
        EXPECT_NEAR(toScreen(v.narrow(0, 0, 1, 1), z * -2).x(), 0.5F + c.z(), 1e-5);
        Volume transformed = v;
        transformed.transform(KpMat4f::identity());
        for (const Volume& reset : {v.zNarrow(1, 0), transformed}) {
            EXPECT_EQ(std::tuple(reset.stereoMode(), reset.stereoEyeScale(), reset.isCameraOffsetSet()),
                      std::tuple(0, 1, false));
        }
    }
}

TEST(KpViewVolume, changesShape)
{
    std::mt19937 random(65);
    for (int round = 0; round < 100; ++round) {
        const Volume v = makeVolume(random, round);
        const KpVec3f place(someNumber(random, 0, 1), someNumber(random, 0, 1), 0.5F);
        const float near = someNumber(random, 0.5F, 0.9F), far = someNumber(random, 0, 0.4F), depth = 1 - near;
        const Volume part = v.narrow(KpBox3f(0.1F, 0.6F, 0.2F, 0.9F, far, near));
        EXPECT_EQ(std::tuple(part.nearDist(), part.nearToFar()), std::tuple(near, (near - far) * v.nearToFar()));
        expectNear(part.llf(), toWorld(v, KpVec3f(0.1F, 0.2F, depth)));
        expectNear(part.lrf(), toWorld(v, KpVec3f(0.6F, 0.2F, depth)));
        expectNear(part.projPoint() + part.ulfO(), toWorld(v, KpVec3f(0.1F, 0.9F, depth)));
        Volume scaled = v.narrow(0.5F, 0, 1, 1);
        expectNear(scaled.llf(), toWorld(v, KpVec3f(0.5F, 0, 0)));
        scaled.scale(-0.5F);
        scaled.scaleHeight(3);
        scaled.scaleWidth(2);
        expectNear(scaled.llf(), toWorld(v, KpVec3f(0.5F, -0.25F, 0)));
        expectNear(scaled.lrf(), toWorld(v, KpVec3f(1, -0.25F, 0)));
        expectNear(scaled.projPoint() + scaled.ulfO(), toWorld(v, KpVec3f(0.5F, 1.25F, 0)));

        // A place on the screen goes with the matrix; a mirror exchanges left and right.
        const bool isMirror = round % 3 == 0;
        KpMat4f matrix;
        matrix.setTransform(someVector(random, 2), KpRotation(someVector(random, 2), someNumber(random, -3, 3)),
                            KpVec3f(isMirror ? -2.0F : 2.0F, 2, 2), KpRotation::identity());
        Volume changed = v;
        changed.transform(matrix);
        EXPECT_NEAR(changed.nearDist(), 2 * v.nearDist(), 1e-3);
        const KpVec3f mirrored(isMirror ? 1 - place.x() : place.x(), place.y(), place.z());
        expectNear(toWorld(changed, mirrored), matrix.multVecMatrix(toWorld(v, place)), 5e-3F);
    }
    Volume behind;
    behind.ortho(-1, 1, -1, 1, -2, 3);
    behind.transform(KpMat4f::identity());
    EXPECT_EQ(behind.nearDist(), -2);
}

TEST(KpViewVolume, tellsWhatIsInside)
{
    std::mt19937 random(65);
    const KpBox3f unit(0, 1, 0, 1, 0, 1);
    for (int round = 0; round < 2000; ++round) {
        const Volume v = makeVolume(random, round);
        const KpVec3f place = someVector(random, 0.9F) + KpVec3f(0.5F, 0.5F, 0.5F), point = toWorld(v, place);
        KpBox3f dot(point, point), box = dot;
        box.extendBy(point + someVector(random, 2));
        const bool isInside = unit.contains(place, -1e-3F), isOutside = !unit.contains(place, 1e-3F);
        EXPECT_TRUE(!isInside || (v.intersect(point) && v.intersect(dot) && v.intersect(box))) << place;
        EXPECT_FALSE(isOutside && (v.intersect(point) || v.intersect(dot))) << place;
    }
    Volume flat;
    flat.ortho(-1, 1, -1, 1, 0, 0);
    EXPECT_FALSE(flat.intersect(origin) || flat.intersect(KpBox3f()));
}

TEST(KpViewVolume, meetsSegmentsAndMeasuresHandles)
{
    const std::pair<KpVec3f, bool> segments[] = {{{-2, 0.5F, -2}, true},
                                                 {{1, 0, -2}, false},
                                                 {{-2, 1.5F, -2}, false},
                                                 {{-2, 0, -4}, false},
                                                 {{-2, 0, 0}, false}};
    for (const auto& [from, meets] : segments)
        for (const bool isBox : {true, false}) {
            Volume v;
            isBox ? v.ortho(-1, 1, -1, 1, 1, 3) : v.perspective(1, 1, 1, 3);
            KpVec3f out;
            EXPECT_EQ(v.intersect(from, from + x * 4, out), meets) << from;
            EXPECT_TRUE(!meets || (out - KpVec3f(0, 0.5F, -2)).length() < 1e-5F);
        }
    Volume box, wide;
    box.ortho(-1, 1, -3, 3, 1, 3);
    wide.perspective(1.5707964F, 2, 1, 9);  // as high as twice the distance
    EXPECT_NEAR(box.getWorldToScreenScale(KpVec3f(0.25F, 0.5F, -2), 0.1F), 0.2F, 1e-4);
    EXPECT_NEAR(box.getWorldToScreenScale(KpVec3f(9, 0, -2), 0.1F), 0.2F, 1e-4);
    EXPECT_NEAR(wide.getWorldToScreenScale(KpVec3f(0, 2, -4), 0.1F), std::hypot(2 - 6 / 4.6, 4 - 20 / 4.6), 1e-4);
}
