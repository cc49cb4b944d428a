#include "SomeVectors.h"

#include <kplib/geometry/KpViewVolume.h>

#include <cmath>

using kplib::test::expectNear, kplib::test::someNumber, kplib::test::someVector;

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

void expectSameShape(const Volume& a, const Volume& b)
{
    expectNear(a.projPoint() + a.projDir(), b.projPoint() + b.projDir());
    expectNear(a.llf(), b.llf());
    expectNear(a.lrfO(), b.lrfO());
    expectNear(a.ulfO(), b.ulfO());
    EXPECT_NEAR(a.nearDist() + 10 * a.nearToFar(), b.nearDist() + 10 * b.nearToFar(), 1e-3);
    for (const Volume& v : {a, b})
        expectNear(v.llf() + v.lrf() + v.ulf(), v.projPoint() * 3 + v.llfO() + v.lrfO() + v.ulfO());
}

}  // namespace

TEST(KpViewVolume, takesTheWorldToTheScreenAndBack)
{
    std::mt19937 random(65);
    for (int round = 0; round < 100; ++round) {
        const Volume v = makeVolume(random, round);
        expectNear(toScreen(v, v.llf()), KpVec3f(0, 0, 0));
        expectNear(toScreen(v, v.lrf()), KpVec3f(1, 0, 0));
        expectNear(toScreen(v, v.ulf()), KpVec3f(0, 1, 0));
        expectNear(v.zVector(), -v.projDir());
        expectNear(v.getCameraSpaceMatrix().multVecMatrix(v.getSightPoint(3)), KpVec3f(0, 0, -3));
        const KpVec2f point(someNumber(random, 0, 1), someNumber(random, 0, 1));
        const KpVec3f far = v.getPlanePoint(v.nearDist() + v.nearToFar(), point);
        expectNear(toScreen(v, far), KpVec3f(point.x(), point.y(), 1));
        expectNear(toWorld(v, KpVec3f(point.x(), point.y(), 1)), far);

        const float width = (v.lrf() - v.llf()).length(), height = (v.ulf() - v.llf()).length();
        expectNear(v.getAlignRotation(false).multVec(KpVec3f(0, height, 0)), v.ulf() - v.llf());
        expectNear(v.getAlignRotation(false).multVec(KpVec3f(width, 0, 0)), v.lrf() - v.llf(), 1e-2F);
    }
    Volume v;
    v.ortho(-1, 1, -1, 1, 1, 3);
    expectNear(toScreen(v, KpVec3f(0, 0, -2)), KpVec3f(0.5F, 0.5F, 0.5F));
    EXPECT_FLOAT_EQ(v.projectBox(KpBox3f(-0.5F, 0.5F, -0.25F, 0, -2, -1)).y(), 0.125F);
    v.frustum(-1, 2, -3, 4, 5, 7);
    EXPECT_TRUE(v.llf() == KpVec3f(-1, -3, 5) && v.nearToFar() == 2 && v.type() == Volume::Perspective);
}

TEST(KpViewVolume, alignsByRightAngles)
{
    const KpVec3f x(1, 0, 0), y(0, 1, 0), z(0, 0, 1);
    const struct {
        KpVec3f axis;
        float angle;
        KpVec3f xTo, yTo;
    } cases[] = {{y, 0.1F, x, y}, {y, 1.6F, -z, y}, {y, -1.6F, z, y}, {z, 3.1415927F, x, -y}};
    for (const auto& c : cases) {  // in the last, that the turn of y counts twice keeps x from coming to the right
        Volume v;
        v.perspective(1, 1, 1, 2);
        v.rotateCamera(KpRotation(c.axis, c.angle));
        expectNear(v.getAlignRotation(true).multVec(x), c.xTo);
        expectNear(v.getAlignRotation(true).multVec(y), c.yTo);
    }
}

TEST(KpViewVolume, shiftsStereoEyesAgainstEachOther)
{
    const struct {
        int mode;
        float eyeScale, offsetScale, offset;  // offset 0: not set
        float shift;
    } cases[] = {{0, 1, 1, 5, 0}, {1, 1, 1, 0, -0.035F}, {7, 2, 3, 0, 0.21F}, {1, 2, 3, 0.5F, 0.375F}};
    for (const auto& c : cases) {
        Volume v;
        v.perspective(1.5707964F, 1, 1, 3);
        v.setStereoMode(c.mode);
        v.setStereoEyeScale(c.eyeScale);
        v.setStereoOffsetScale(c.offsetScale);
        if (c.offset != 0)
            v.setCameraOffset(c.offset);
        EXPECT_NEAR(toScreen(v.narrow(0, 0, 1, 1), KpVec3f(0, 0, -2)).x(), 0.5F + c.shift, 1e-5);
        Volume slab = v.zNarrow(1, 0);
        v.transform(KpMat4f::identity());
        for (const Volume* reset : {&v, &slab})
            EXPECT_TRUE(reset->stereoMode() == 0 && reset->stereoEyeScale() == 1 && !reset->isCameraOffsetSet());
    }
}

TEST(KpViewVolume, changesShape)
{
    std::mt19937 random(65);
    for (int round = 0; round < 100; ++round) {
        const Volume v = makeVolume(random, round);
        const KpVec3f low(0.1F, 0.2F, 0), high(0.6F, 0.9F, 1),
            place(someNumber(random, 0, 1), someNumber(random, 0, 1), 0.5F);
        const Volume part = v.narrow(low.x(), low.y(), high.x(), high.y());
        expectNear(toWorld(part, place), toWorld(v, low + (high - low) * place));
        const float near = someNumber(random, 0.5F, 0.9F), far = someNumber(random, 0, 0.4F);
        const Volume slab = v.zNarrow(near, far);
        EXPECT_TRUE(slab.nearDist() == near && slab.nearToFar() == (near - far) * v.nearToFar());
        expectNear(slab.llf(), toWorld(v, KpVec3f(0, 0, 1 - near)));
        expectNear(slab.lrf(), toWorld(v, KpVec3f(1, 0, 1 - near)));
        expectNear(slab.ulf(), toWorld(v, KpVec3f(0, 1, 1 - near)));
        expectSameShape(v.narrow(KpBox3f(0.1F, 0.6F, 0.2F, 0.9F, -1, 2)), part.zNarrow(1, 0));
        Volume half = v, high3 = v;
        half.scale(-0.5F);
        expectSameShape(half, v.narrow(0.25F, 0.25F, 0.75F, 0.75F));
        high3.scaleHeight(3);
        expectSameShape(high3, v.narrow(0, -1, 1, 2));

        // A place on the screen goes with the matrix; a mirror exchanges left and right.
        const bool isMirror = round % 3 == 0;
        KpMat4f turn, move, scale;
        turn.setRotate(KpRotation(someVector(random, 2), someNumber(random, -3, 3)));
        move.setTranslate(someVector(random, 2));
        scale.setScale(KpVec3f(isMirror ? -2.0F : 2.0F, 2, 2));
        const KpMat4f matrix = turn * scale * move;
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
    for (int round = 0; round < 2000; ++round) {
        const Volume v = makeVolume(random, round);
        const KpVec3f place = someVector(random, 0.9F) + KpVec3f(0.5F, 0.5F, 0.5F), point = toWorld(v, place);
        KpBox3f box(point, point);
        box.extendBy(point + someVector(random, 2));
        if (KpBox3f(0, 1, 0, 1, 0, 1).contains(place, -1e-3F)) {
            EXPECT_TRUE(v.intersect(point)) << place;
            EXPECT_TRUE(v.intersect(box)) << "a box with a point inside is never culled";
        } else if (!KpBox3f(0, 1, 0, 1, 0, 1).contains(place, 1e-3F)) {
            EXPECT_FALSE(v.intersect(point)) << place;
            EXPECT_FALSE(v.intersect(KpBox3f(point, point))) << place;
        }
        EXPECT_FALSE(v.intersect(KpBox3f()));
    }
    Volume flat;
    flat.ortho(-1, 1, -1, 1, 0, 0);
    EXPECT_FALSE(flat.intersect(KpVec3f(0, 0, 0)));
}

TEST(KpViewVolume, meetsSegmentsNearItsCentralLine)
{
    const struct {
        KpVec3f p0, p1;
        bool meets;
    } cases[] = {{{-5, 0.5F, -2}, {5, 0.5F, -2}, true},  {{1, 0, -2}, {5, 0, -2}, false},
                 {{-5, 1.5F, -2}, {5, 1.5F, -2}, false}, {{-5, 0, -4}, {5, 0, -4}, false},
                 {{0.5F, 0, -1}, {0.5F, 0, -3}, false},  {{0, 0, -2}, {0, 0, -2}, false}};
    for (const bool isBox : {true, false}) {
        Volume v;
        isBox ? v.ortho(-1, 1, -1, 1, 1, 3) : v.perspective(1, 1, 1, 3);
        for (const auto& c : cases) {
            KpVec3f out;
            EXPECT_EQ(v.intersect(c.p0, c.p1, out), c.meets) << c.p0 << c.p1;
            EXPECT_TRUE(!c.meets || (out - KpVec3f(0, 0.5F, -2)).length() < 1e-5F);
        }
    }
}

TEST(KpViewVolume, measuresHandles)
{
    Volume box, wide;
    box.ortho(-1, 1, -3, 3, 1, 3);
    wide.perspective(1.5707964F, 2, 1, 9);  // as high as twice the distance
    EXPECT_NEAR(box.getWorldToScreenScale(KpVec3f(0.25F, 0.5F, -2), 0.1F), 0.2F, 1e-4);
    EXPECT_NEAR(box.getWorldToScreenScale(KpVec3f(9, 0, -2), 0.1F), 0.2F, 1e-4);
    EXPECT_NEAR(wide.getWorldToScreenScale(KpVec3f(0, 0, -4), 0.1F), 0.8F, 1e-4);
}
