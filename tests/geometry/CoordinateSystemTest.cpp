#include "SomeVectors.h"

#include <kplib/geometry/KpCoordinateSystem.h>
#include <kplib/geometry/KpFrameOfReference.h>
#include <kplib/geometry/KpPlane.h>

#include <cmath>

using kplib::test::expectNear, kplib::test::someNumber, kplib::test::someVector;

namespace {

using Frame = KpHandle<const KpFrameOfReference>;
using System = KpHandle<KpCoordinateSystem>;

// Gives it the axes of a turned and slightly sheared box: inverses stay exact enough to compare.
void shape(KpCoordinateSystem& system, std::mt19937& random)
{
    system.setOrigin(someVector(random, 2));
    system.setAxesByRotation(KpRotation(someVector(random, 2), someNumber(random, -3, 3)));
    for (int i = 0; i < 3; ++i)
        system.setAxis(i, (system.axis(i) + someVector(random, 0.1F)) * someNumber(random, 0.5F, 1.5F));
}

System child(const KpAbstractCoordinateSystem& parent, std::mt19937& random)
{
    System system = parent.createChildSystem();
    shape(*system, random);
    return system;
}

// Where a point of `system` is in the root, one parent at a time.
KpVec3f inRoot(const KpCoordinateSystem& system, KpVec3f p)
{
    for (const KpAbstractCoordinateSystem* s : system.path()) {
        if (const auto* c = dynamic_cast<const KpCoordinateSystem*>(s))
            p = c->origin() + c->axis(0) * p.x() + c->axis(1) * p.y() + c->axis(2) * p.z();
    }
    return p;
}

void expectRightHandedUnitAxes(const KpCoordinateSystem& s, const KpVec3f& z)
{
    EXPECT_TRUE(s.orientationAsMatrix().equals(s.orientationAsMatrix().transpose().inverse(), 1e-5F));
    EXPECT_TRUE(s.isRightHanded());
    expectNear(s.axis(KpCoordinateSystem::AxisZ), z / z.length(), 1e-5F);
}

}  // namespace

TEST(KpCoordinateSystem, badInputIsNaN)
{
    const KpVec3f x(1, 0, 0), z(0, 0, 1);
    const KpCoordinateSystem flat(z, {x, x, z}), unit;
    EXPECT_TRUE(!flat.isValid() && std::isnan(flat.origin().x()) && std::isnan(flat.axis(2).z()));
    const System parent(new KpCoordinateSystem);
    KpCoordinateSystem system;
    system.setParent(parent.get());
    system.setSystemByPlane(KpPlane::emptyPlane(), x);
    EXPECT_TRUE(!system.isValid() && system.equalsAxis(unit) && !system.equals(system, 1)) << "only the place is lost";
    system.makeNaN();
    system.setSystemByPlane(KpPlane(z, 3.0F));
    EXPECT_TRUE(system.isValid() && system.origin() == z * 3 && system.parent() == parent.get());
}

TEST(KpCoordinateSystem, makesAxesFromDirections)
{
    std::mt19937 random(64);
    for (int round = 0; round < 100; ++round) {
        const KpVec3f z = someVector(random, 2), hint = someVector(random, 2);
        KpCoordinateSystem system;
        system.setAxes(z, hint);
        expectRightHandedUnitAxes(system, z);
        EXPECT_GT(system.axis(0).dot(hint), 0);
        EXPECT_NEAR(system.axis(1).dot(hint), 0, 1e-5);
        system.setAxes(z, KpVec3f(0, 0, 0));
        expectRightHandedUnitAxes(system, z);
        system.setSystemByPlane(KpPlane(z, hint), hint);
        expectRightHandedUnitAxes(system, z);

        shape(system, random);
        system.setAxis(round % 3, -system.axis(round % 3));  // left-handed
        const KpCoordinateSystem before = system;
        system.makePerpendicular(1, true);
        EXPECT_TRUE(system.axis(1) == before.axis(1) && !system.isRightHanded());
        EXPECT_TRUE(system.axis(0).dot(before.axis(0)) > 0 && system.axis(2).dot(before.axis(2)) > 0);
        system.makePerpendicular(1, false);
        system.normalizeAxes();
        expectRightHandedUnitAxes(system, system.axis(2));
    }
}

TEST(KpCoordinateSystem, comparesAxesByLengthAndDirection)
{
    KpCoordinateSystem unit, other;
    other.setOrigin(KpVec3f(0, -0.5F, 0.25F));
    EXPECT_TRUE(unit.equals(other, 0.51F) && !unit.equals(other, 0.5F));
    const std::pair<KpVec3f, bool> xAxes[] = {
        {{0.99995F, 0.01F, 0}, true}, {{0.9998F, 0.02F, 0}, false}, {{2, 0, 0}, false}, {{0, 0, 0}, false}};
    for (const auto& [axis, matches] : xAxes) {
        other.setAxis(0, axis);
        EXPECT_TRUE(unit.equalsAxis(other) == matches && other.equalsAxis(other)) << axis;
    }
}

TEST(KpCoordinateSystem, relatesSystemsOfOneFrame)
{
    std::mt19937 random(64);
    const Frame frame(new KpFrameOfReference("scanner"));
    for (int round = 0; round < 50; ++round) {
        const System top = child(*frame, random), left = child(*child(*top, random), random);
        const System middle = child(*top, random), right = child(*middle, random);
        const KpVec3f p = someVector(random, 2);
        const KpMat4f there = left->transformationTo(*right), back = left->transformationFrom(*right);
        expectNear(inRoot(*right, there.multVecMatrix(p)), inRoot(*left, p));
        expectNear(back.multVecMatrix(there.multVecMatrix(p)), p);
        EXPECT_EQ(right->asTransformationUpTo(*middle), right->asTransformation() * middle->asTransformation());
        EXPECT_EQ(right->asTransformationUpTo(*left), right->asTransformationToFrameOfReference());

        const System merged = right->mergedWithParent(), moved = left->asChildOf(*right);
        EXPECT_TRUE(merged->parent() == top.get() && moved->parent() == right.get());
        expectNear(inRoot(*merged, p), inRoot(*right, p));
        expectNear(inRoot(*moved, p), inRoot(*left, p));
        EXPECT_TRUE(left->commonAncestor(*right) == top.get() && right->commonAncestor(*middle) == middle.get());
    }
    EXPECT_EQ(frame->refCount(), 1) << "all children are gone";
}

TEST(KpCoordinateSystem, keepsApartWhatDoesNotMeet)
{
    const Frame a(new KpFrameOfReference("a")), again(new KpFrameOfReference("a")), b(new KpFrameOfReference("b"));
    const System inA = a->createChildSystem(), inAgain = again->createChildSystem(), inB = b->createChildSystem();
    const System floating(new KpCoordinateSystem), onFloating = floating->createChildSystem();
    EXPECT_TRUE(inA->isCompatibleWith(*inAgain) && !inA->commonAncestor(*inAgain));
    for (const System& other : {inB, floating, onFloating}) {
        KpMat4f unwritten = KpMat4f::identity();
        EXPECT_FALSE(inA->isCompatibleWith(*other) || other->isCompatibleWith(*inA) || inA->commonAncestor(*other));
        EXPECT_FALSE(inA->transformationTo(*other, unwritten) || inA->transformationFrom(*other, unwritten));
        EXPECT_TRUE(unwritten.isIdentity() && !inA->transformationTo(*other).isNumber());
        EXPECT_FALSE(inA->asChildOf(*other)->parent());
    }
    EXPECT_FALSE(onFloating->isCompatibleWith(*floating) || floating->isCompatibleWith(*floating));
}

TEST(KpCoordinateSystem, onTheStackOutlivesItsQuestions)
{
    const KpFrameOfReference frame("a");
    const Frame parent(new KpFrameOfReference("a"));
    KpCoordinateSystem system, floating;
    system.setParent(parent.get());
    const KpAbstractCoordinateSystem* const others[] = {&frame, &floating};
    for (const KpAbstractCoordinateSystem* other : others) {
        EXPECT_EQ(system.isCompatibleWith(*other), other == &frame);
        EXPECT_EQ(system.transformationTo(*other).isNumber(), other == &frame);
        EXPECT_FALSE(system.commonAncestor(*other));
        EXPECT_TRUE(system.asTransformationUpTo(*other).isIdentity());
        EXPECT_EQ(other->refCount(), 0);
    }
    EXPECT_TRUE(system.transformationTo(system).isIdentity() && system.path().size() == 2);
    EXPECT_TRUE(floating.mergedWithParent()->equals(*system.mergedWithParent(), 1e-6F));
    EXPECT_EQ(system.dump().substr(0, 58), R"("KpCoordinateSystem":{"origin":{"x":"0.000000","y":"0.0000)");
    EXPECT_TRUE(system.dump().ends_with(R"("},"parent": {"FrameOfReference":{"id":"a","parent": {}}}})"));
    EXPECT_TRUE(system.refCount() == 0 && parent->refCount() == 2);
}
