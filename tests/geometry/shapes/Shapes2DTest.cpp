#include <kplib/geometry/shapes/Angle2D.h>
#include <kplib/geometry/shapes/Circle2D.h>
#include <kplib/geometry/shapes/Ellipse2D.h>
#include <kplib/geometry/shapes/Polygon2D.h>

#include <gtest/gtest.h>

#include <cmath>
#include <random>

namespace {

using Points = std::vector<KpVec2f>;

bool isNear(const KpVec2f& a, const KpVec2f& b)
{
    return (a - b).length() < 1e-5F;
}

TEST(Rectangle2D, cornersAreExchangedAsPairs)
{
    const Rectangle2D exchanged({1, 0}, {0, 1}), crossed({0, 1}, {1, 0});
    EXPECT_EQ(std::tuple(exchanged.getUpperLeft(), crossed.getUpperLeft()), std::tuple(KpVec2f(0, 1), KpVec2f(0, 1)));
    EXPECT_FALSE(crossed.contains({0.5F, 0.5F}));
    EXPECT_EQ(crossed.closestPoint({5, 0.5F}).second, KpVec2f(1, 0.5F));
    EXPECT_EQ(Rectangle2D({0, 5}, {0, 3}).getUpperLeft(), KpVec2f(0, 3));  // equal in x: by y
    const auto unsorted = Rectangle2D::fromPositionAndSize({4, 4}, {-2, -2});
    EXPECT_EQ(unsorted.getLowerRight(), KpVec2f(2, 2));
    EXPECT_TRUE(Rectangle2D::fromCenterAndHalfSize({3, 3}, {-1, -1}) == unsorted);
}

TEST(Rectangle2D, holdsMergesAndGoesRound)
{
    Rectangle2D box({1, 2}, {3, 6});
    for (const auto& [p, isIn] :
         {std::pair(KpVec2f(1, 2), true), {{3, 6}, true}, {{3, 6.5F}, false}, {{0.5F, 3}, false}})
        EXPECT_EQ(box.contains(p), isIn) << p;
    EXPECT_EQ(box.vertices(), (Points{{1, 2}, {3, 2}, {3, 6}, {1, 6}, {1, 2}}));
    EXPECT_EQ(box.closestPoint({9, 0}).second, KpVec2f(3, 2));
    box.merge(Rectangle2D({0, 3}, {2, 9}));
    EXPECT_EQ(box, Rectangle2D({0, 2}, {3, 9}));
    EXPECT_EQ(box.boundingBox(), box);
    EXPECT_EQ(std::tuple(Rectangle2D().isEmpty(), Rectangle2D({0, 0}, {1, 1}).isEmpty()), std::tuple(true, false));
    EXPECT_NE(box, Rectangle2D());
}

TEST(Ellipse2D, pointsAndMeasures)
{
    const Circle2D circle({1, 2}, 2);
    EXPECT_TRUE(isNear(circle.projectPoint(1.5707963F), {1, 4}));
    EXPECT_TRUE(isNear(circle.closestPoint({9, 2}).second, {3, 2}));
    EXPECT_FLOAT_EQ(circle.circumference(), 12.566371F);
    EXPECT_TRUE(circle.boundingBox() == Rectangle2D({-1, 0}, {3, 4}));
    const Points chords = circle.tesselate(4);
    ASSERT_EQ(chords.size(), 5U);
    for (const auto& [i, p] : {std::pair(0, KpVec2f(3, 2)), {1, {1, 4}}, {2, {-1, 2}}, {4, {3, 2}}})
        EXPECT_TRUE(isNear(chords[i], p)) << i;

    const auto ellipse = Ellipse2D::span({6, 1}, {0, 3});
    EXPECT_TRUE(ellipse == Ellipse2D({3, 2}, 3, 1));
    EXPECT_NEAR(ellipse.circumference(), 13.364893, 1e-4);  // the integral 4 a E(e)
    EXPECT_TRUE(isNear(ellipse.closestPoint({6, 3}).second, {3 + 3 * std::sqrt(0.5F), 2 + std::sqrt(0.5F)}));
    const auto outer = Ellipse2D::spanInner({0, 1}, {6, 3});
    for (const KpVec2f& corner : Rectangle2D({0, 1}, {6, 3}).vertices()) {
        const KpVec2f d = (corner - outer.center()) / outer.AbstractEllipse2D::radius();
        EXPECT_NEAR(d.length(), 1, 1e-6);
    }
    EXPECT_EQ(std::tuple(Ellipse2D().isEmpty(), Ellipse2D().circumference()), std::tuple(true, 0));
    EXPECT_FALSE(Ellipse2D({0, 0}, std::nanf(""), 0).isEmpty());
    Ellipse2D resized({3, 2}, 1, 2);
    resized.setRadius({3, 1});
    EXPECT_TRUE(resized == ellipse);
    EXPECT_EQ(Ellipse2D({0, 0}, 0, 2).closestPoint({0, 7}).second.y(), 2);
}

TEST(Polyline2D, changesDropTheBox)
{
    Polyline2D line({{1, 2}, {4, 6}});
    EXPECT_TRUE(line.boundingBox() == Rectangle2D({1, 2}, {4, 6}));
    line.append({0, 9});
    EXPECT_TRUE(line.boundingBox() == Rectangle2D({0, 2}, {4, 9}));
    line.set(0, {-1, 0});
    EXPECT_TRUE(line.boundingBox() == Rectangle2D({-1, 0}, {4, 9}));
    line.offset({2, 1});
    line.offset(line.at(0));  // (1, 1), one of its own
    EXPECT_TRUE(line.boundingBox() == Rectangle2D({2, 2}, {7, 11}));
    line.setVertices({{2, 2}});
    EXPECT_TRUE(line.boundingBox() == Rectangle2D({2, 2}, {2, 2}));
    line.clear();
    EXPECT_TRUE(line.boundingBox().isEmpty());
    EXPECT_EQ(std::tuple(line.isEmpty(), line.numberOfSegments()), std::tuple(true, 0));
    EXPECT_THROW(line.at(0), std::out_of_range);
}

TEST(Polyline2D, closesAndMeasures)
{
    Polyline2D line({{0, 0}, {3, 4}, {3, 4}, {3, 0}, {9, 9}});
    EXPECT_DOUBLE_EQ(line.length(), 5.0 + 4.0 + static_cast<double>(static_cast<float>(std::hypot(6.0, 9.0))));
    EXPECT_EQ(line.numberOfSegments(), 4U);
    EXPECT_FLOAT_EQ(line.lengthOfSegment(1), 4);  // of vertices 2 and 3
    EXPECT_EQ(line.lengthOfSegment(2), 0);
    EXPECT_FALSE(line.isClosed());
    for (int times = 0; times < 2; ++times)
        EXPECT_TRUE(line.close());
    EXPECT_EQ(std::tuple(line.isClosed(), line.size()), std::tuple(true, 6));
    EXPECT_FALSE(Polyline2D({{0, 0}, {0, 0}}).close() || Polyline2D({{0, 0}, {0, 0}}).isClosed());

    EXPECT_EQ(line.closestPoint({3, 2}).second, KpVec2f(3, 2));
    EXPECT_EQ(Polyline2D({{0, 2}, {0, 0}, {4, 0}}).closestPoint({2, 2}).second, KpVec2f(0, 2));  // the first of equals
    EXPECT_FALSE(Polyline2D().closestPoint({1, 1}).first);
    EXPECT_EQ(Polyline2D({{7, 7}}).closestPoint({1, 1}).second, KpVec2f(7, 7));
    EXPECT_EQ(Polyline2D({{7, 7}, {7, 7}}).closestPoint({1, 1}).second, KpVec2f(7, 7));
}

TEST(Polygon2D, staysClosed)
{
    Polygon2D polygon({{0, 0}, {1, 0}, {0, 1}});
    EXPECT_EQ(polygon.vertices(), (Points{{0, 0}, {1, 0}, {0, 1}, {0, 0}}));
    polygon.append({-1, -1});
    EXPECT_EQ(polygon.vertices(), (Points{{0, 0}, {1, 0}, {0, 1}, {-1, -1}, {0, 0}}));
    EXPECT_EQ(Polygon2D({{0, 0}, {1, 0}, {0, 0}}).size(), 3U);
    Polygon2D grown;
    grown.append({2, 3});
    EXPECT_EQ(grown.vertices(), (Points{{2, 3}, {2, 3}}));
}

/// Winding by angles, away from the border the same as the crossings of a simple polygon.
bool isInside(const Points& corners, const KpVec2f& p)
{
    double turn = 0;
    for (size_t i = 0; i < corners.size(); ++i) {
        const KpVec2f a = corners[i] - p, b = corners[(i + 1) % corners.size()] - p;
        turn += std::atan2(static_cast<double>(a.x() * b.y() - a.y() * b.x()), static_cast<double>(a.dot(b)));
    }
    return std::abs(turn) > 3;
}

TEST(Polygon2D, isFilled)
{
    const Points star = {{0, 0}, {4, 1}, {8, 0}, {7, 4}, {8, 8}, {4, 7}, {0, 8}, {1, 4}};
    const Polygon2D polygon(star);
    std::mt19937 random(9);
    std::uniform_real_distribution<float> anywhere(-1, 9);
    for (int i = 0; i < 5000; ++i) {
        const KpVec2f p(anywhere(random), anywhere(random));
        ASSERT_EQ(polygon.contains(p), isInside(star, p)) << p;
        ASSERT_EQ(polygon.closestPoint(p).second == p, polygon.contains(p));
    }
    // On the border: the right and the lower (greater y) side of a square count.
    const Polygon2D square({{0, 0}, {2, 0}, {2, 2}, {0, 2}});
    for (const KpVec2f& p : Points{{2, 1}, {1, 2}, {0, 1}, {1, 0}})
        EXPECT_EQ(square.contains(p), std::max(p.x(), p.y()) == 2) << p;
    EXPECT_TRUE(Polygon2D({{0, 0}, {4, 0}, {0, 4}}).contains({2, 2}));
    EXPECT_FALSE(Polygon2D().contains({0, 0}));
}

TEST(Angle2D, hasThreeVertices)
{
    Angle2D angle({{1, 0}, {0, 0}, {0, 1}});
    EXPECT_FLOAT_EQ(angle.angle().second, 1.5707964F);
    angle.append({5, 5});
    angle.setVertices({{1, 1}});
    EXPECT_EQ(angle.size(), 3U);
    angle.setVertices({{2, 2}, {0, 0}, {2, 2}});
    EXPECT_EQ(angle.angle(), std::make_pair(true, 0.0F));
    for (const KpVec2f& end : {KpVec2f(0.03F, 0), KpVec2f(2, 2)}) {  // one arm or the other of 0.0009
        angle.setVertices({end, {0, 0}, KpVec2f(2.03F, 2) - end});
        EXPECT_FALSE(angle.isValid() || angle.angle().first);
    }
    EXPECT_TRUE(Angle2D({{1, 0}, {0, 0}}).isEmpty());
    EXPECT_FALSE(Angle2D({{1, 0}, {0, 0}}).angle().first);
}

TEST(Shapes2D, differInKindBeforeTheyDifferInNumbers)
{
    const Points points = {{0, 0}, {1, 0}, {0, 0}};
    const Polyline2D line(points);
    const Polygon2D polygon(points);
    const Angle2D angle(points);
    const Circle2D circle({0, 0}, 1);
    const Ellipse2D ellipse({0, 0}, 1, 1);
    const AbstractShape2D* shapes[] = {&line, &polygon, &angle, &circle, &ellipse};
    for (const auto* a : shapes) {
        for (const auto* b : shapes)
            EXPECT_EQ(*a == *b, a == b);
    }
    EXPECT_EQ(line, Polyline2D(points));
    EXPECT_NE(circle, Circle2D({0, 0}, 2));
}

}  // namespace
