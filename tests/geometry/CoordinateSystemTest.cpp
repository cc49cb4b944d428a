#include "SomeVectors.h"

#include <kplib/geometry/KpCoordinateSystem.h>
#include <kplib/geometry/KpFrameOfReference.h>
#include <kplib/geometry/KpPlane.h>

using namespace kplib::test;

namespace {

using Frame = KpHandle<const KpFrameOfReference>;
using System = KpHandle<KpCoordinateSystem>;

// The axes of a turned and slightly sheared box: inverses stay exact enough to compare.
System child(const KpAbstractCoordinateSystem& parent, std::mt19937& random)
{
    System system = parent.createChildSystem();
    system->setOrigin(someVector(random, 2));
    system->setAxesByRotation(KpRotation(someVector(random, 2), someNumber(random, -3, 3)));
    for (int i = 0; i < 3; ++i)
        system->setAxis(i, (system->axis(i) + someVector(random, 0.1F)) * someNumber(random, 0.5F, 1.5F));
    return system;
}

void expectRightHandedUnitAxes(const KpCoordinateSystem& s, const KpVec3f& direction)
{
    EXPECT_TRUE(s.orientationAsMatrix().equals(s.orientationAsMatrix().transpose().inverse(), 1e-5F));
    EXPECT_TRUE(s.isRightHanded());
    expectNear(s.axis(KpCoordinateSystem::AxisZ), direction / direction.length(), 1e-5F);
}

}  // namespace

TEST(KpCoordinateSystem, makesAxesFromDirections)
{
    std::mt19937 random(64);
    const Frame frame(new KpFrameOfReference("scanner"));
    for (int round = 0; round < 100; ++round) {
        const KpVec3f up = someVector(random, 2), hint = someVector(random, 2);
        KpCoordinateSystem system;
        system.setAxes(up, hint);
        expectRightHandedUnitAxes(system, up);
        EXPECT_GT(system.axis(0).dot(hint), 0);
        EXPECT_NEAR(system.axis(1).dot(hint), 0, 1e-5);
        system.setAxes(up, origin);
        expectRightHandedUnitAxes(system, up);
        system.setSystemByPlane(KpPlane(up, hint), hint);
        expectRightHandedUnitAxes(system, up);

        system = *child(*frame, random);
        system.setAxis(round % 3, -system.axis(round % 3));  // left-handed
        const KpCoordinateSystem before = system;
        system.makePerpendicular(1, true);
        EXPECT_EQ(system.axis(1), before.axis(1));
        EXPECT_FALSE(system.isRightHanded());
        EXPECT_GT(system.axis(0).dot(before.axis(0)), 0);
        EXPECT_GT(system.axis(2).dot(before.axis(2)), 0);
        system.makePerpendicular(1, false);
        system.normalizeAxes();
        expectRightHandedUnitAxes(system, system.axis(2));
    }
}

TEST(KpCoordinateSystem, tellsWhatItsAxesAre)
{
    const KpCoordinateSystem flat(z, {x, x, z}), unit;
    EXPECT_EQ(std::tuple(flat.isValid(), isNaN(flat.origin()), isNaN(flat.axis(2))), std::tuple(false, true, true));
    KpCoordinateSystem system;
    system.setSystemByPlane(KpPlane::emptyPlane(), x);
    EXPECT_EQ(std::tuple(system.isValid(), system.equalsAxis(unit)), std::tuple(false, true))
        << "only the place is lost";
    system.setSystemByPlane(KpPlane(z, 3.0F));
    EXPECT_TRUE(system.isValid());
    EXPECT_FALSE(unit.equalsAxis(KpCoordinateSystem(origin, {x, y, -z})));
    EXPECT_TRUE(system.equals(KpCoordinateSystem(z * 3, {y, -x, z}), 1e-6F));
    EXPECT_FALSE(system.equals(KpCoordinateSystem(z * 2, {y, -x, z}), 1)) << "the limit is outside";
    for (const auto& [axis, matches] :
         {std::pair{KpVec3f(0.99995F, 0.01F, 0), true}, {{0.9998F, 0.02F, 0}, false}, {x * 2, false}}) {
        system.setAxes({axis, y, z});
        EXPECT_EQ(std::tuple(unit.equalsAxis(system), system.equalsAxis(system)), std::tuple(matches, true)) << axis;
    }
}

TEST(KpCoordinateSystem, relatesSystemsOfOneFrame)
{
    std::mt19937 random(64);
    const Frame frame(new KpFrameOfReference("scanner"));
    const auto inRoot = [](const System& s, const KpVec3f& p) {
        return s->asTransformationToFrameOfReference().multVecMatrix(p);
    };
    for (int round = 0; round < 50; ++round) {
        const System top = child(*frame, random), left = child(*child(*top, random), random);
        const System middle = child(*top, random), right = child(*middle, random);
        const KpVec3f p = someVector(random, 2);
        expectNear(top->asTransformation().multVecMatrix(p),
                   top->origin() + top->axis(0) * p.x() + top->axis(1) * p.y() + top->axis(2) * p.z());
        expectNear(inRoot(right, left->transformationTo(*right).multVecMatrix(p)), inRoot(left, p));
        expectNear(inRoot(right, p), inRoot(left, left->transformationFrom(*right).multVecMatrix(p)));
        EXPECT_EQ(right->asTransformationUpTo(*middle), right->asTransformation() * middle->asTransformation());
        const KpMat4f all = right->asTransformationUpTo(*middle) * top->asTransformation();
        EXPECT_EQ(right->asTransformationToFrameOfReference(), all);
        EXPECT_EQ(right->asTransformationUpTo(*left), all);

        const System merged = right->mergedWithParent(), moved = left->asChildOf(*right);
        EXPECT_EQ(std::tuple(merged->parent(), moved->parent()), std::tuple(top.get(), right.get()));
        expectNear(inRoot(merged, p) + inRoot(moved, p), inRoot(right, p) + inRoot(left, p));
        EXPECT_EQ(left->commonAncestor(*right), top.get());
        EXPECT_EQ(right->commonAncestor(*middle), middle.get());
    }
    EXPECT_EQ(frame->refCount(), 1) << "all children are gone";
}

TEST(KpCoordinateSystem, keepsApartWhatDoesNotMeet)
{
    const Frame a(new KpFrameOfReference("a")), again(new KpFrameOfReference("a")), b(new KpFrameOfReference("b"));
    const System inA = a->createChildSystem(), inAgain = again->createChildSystem(), inB = b->createChildSystem();
    const System floating(new KpCoordinateSystem), onFloating = floating->createChildSystem();
    EXPECT_TRUE(inA->isCompatibleWith(*inAgain));
    EXPECT_FALSE(inA->commonAncestor(*inAgain));
    for (const System& other : {inB, floating, onFloating}) {
        KpMat4f unwritten = KpMat4f::identity();
        EXPECT_FALSE(inA->isCompatibleWith(*other) || other->isCompatibleWith(*inA) || inA->commonAncestor(*other));
        EXPECT_FALSE(inA->transformationTo(*other, unwritten) || inA->transformationFrom(*other, unwritten));
        EXPECT_TRUE(unwritten.isIdentity());
        EXPECT_FALSE(inA->transformationTo(*other).isNumber());
        EXPECT_FALSE(inA->asChildOf(*other)->parent() || other->isCompatibleWith(*floating));
    }
    KpCoordinateSystem system;  // on the stack it outlives what is asked of it
    system.setParent(a.get());
    EXPECT_TRUE(system.transformationTo(*again).isIdentity());
    EXPECT_FALSE(system.commonAncestor(*again));
    EXPECT_TRUE(system.transformationTo(system).isIdentity());
    EXPECT_EQ(system.refCount(), 0);
    EXPECT_TRUE(system.dump().starts_with(R"("KpCoordinateSystem":{"origin":{"x":"0.000000","y":"0.0000)"));
    EXPECT_TRUE(system.dump().ends_with(R"("},"parent": {"FrameOfReference":{"id":"a","parent": {}}}})"));
}
