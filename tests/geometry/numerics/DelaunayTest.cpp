#include <geometry/numerics/PlainDelaunay.h>
#include <support/LogCapture.h>
#include <support/TempFolder.h>

#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/geometry/numerics/KpDelaunay.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <map>
#include <random>
#include <string>

using namespace kplib::detail::delaunay;
using namespace kplib::test;

namespace {

constexpr double pi = 3.141592653589793;
constexpr float infinite = std::numeric_limits<float>::infinity(), nan = std::numeric_limits<float>::quiet_NaN();

using Coordinates = std::vector<float>;

template <int Size, typename Make>
Coordinates many(int n, Make make)  // of the number of a point and an axis
{
    Coordinates result;
    for (int i = 0; i < n; ++i)
        for (int axis = 0; axis < Size; ++axis)
            result.push_back(static_cast<float>(make(i, axis)));
    return result;
}

/// On the unit circle, or spread over the unit sphere.
template <int Size>
Coordinates roundAndCenter(int n)
{
    Coordinates result = many<Size>(n, [n](int i, int axis) {
        const double z = Size == 2 ? 0 : 1 - (2 * i + 1.0) / n;
        const double angle = Size == 2 ? 2 * pi * i / n : i * pi * (3 - std::sqrt(5.0)), r = std::sqrt(1 - z * z);
        return axis == 2 ? z : axis == 1 ? r * std::sin(angle) : r * std::cos(angle);
    });
    result.resize(result.size() + Size);
    return result;
}

template <int Size>
std::map<std::string, Coordinates> inputs()
{
    static std::mt19937 random(5);
    const auto noise = [](int, int) { return std::uniform_real_distribution<double>(-1, 1)(random); };
    const auto scaled = [&](double scale) { return [=](int, int) { return scale * noise(0, 0); }; };
    const auto withOdd = [&](float odd) {
        Coordinates result = many<Size>(120, noise);
        for (const int point : {60, 75, 90})  // some of them meet empty slots
            result[point * Size] = odd;
        return result;
    };
    std::map<std::string, Coordinates> result = {
        {"noise", many<Size>(600, noise)},
        {"tiny", many<Size>(100, scaled(1e-38))},
        {"huge", many<Size>(100, scaled(1e18))},
        {"beyond the first circle", many<Size>(30, scaled(1e20))},
        {"clusters within clusters",
         many<Size>(600, [&](int i, int) { return std::pow(4.0, -(i / 60)) * noise(0, 0); })},
        {"far clusters", many<Size>(300, [&](int i, int) { return i % 3 * 1e4 + noise(0, 0) * 1e-2; })},
        {"lattice", many<Size>(343,
                               [](int i, int axis) {
                                   return i / std::array{1, 7, 49}[axis] % 7;
                               })},
        {"twice the same", many<Size>(120, [](int i, int axis) { return (i % 60 * 37 + axis * (i % 60) * 11) % 61; })},
        {"one place", many<Size>(9, [](int, int) { return 0.7; })},
        {"a slanted line", many<Size>(80, [](int i, int axis) { return i * (axis + 1); })},
        {"round with a centre", roundAndCenter<Size>(200)},
        {"infinite", withOdd(infinite)},
        {"not a number", withOdd(nan)},
    };
    for (int n = 0; n <= Size + 2; ++n)
        result[std::to_string(n) + " points"] = many<Size>(n, noise);
    return result;
}

template <int Size>
std::vector<std::pair<std::string, Finder>> finders()
{
    std::vector<std::pair<std::string, Finder>> result;
    for (const auto& path : circleScanPaths<Size>())
        if (path.usable) {
            for (const long gridFrom : {std::numeric_limits<long>::max(), 100L, 0L})
                result.push_back({path.name + (", grid from " + std::to_string(gridFrom)), {path.run, gridFrom}});
        }
    return result;
}

template <int Size>
void comparesToPlain(const std::string& what, const Coordinates& coordinates)
{
    const auto set = shifted<Size>(coordinates.data(), static_cast<int>(coordinates.size() / Size));
    const auto expected = plainDelaunay<Size>(set, Size == 2 ? 1025 : 16385);
    for (const auto& [name, finder] : finders<Size>()) {
        SCOPED_TRACE(std::to_string(Size) + "D, " + what + ", " + name);
        KpDArray<Simplex<Size>> result{{7, 8, 9}};
        ASSERT_EQ(triangulate<Size>(set, finder, result), expected.has_value());
        if (expected)
            ASSERT_EQ(std::vector(result.begin(), result.end()), *expected);
        else
            ASSERT_EQ(result.size(), 1);
    }
}

TEST(KpDelaunay, equalsThePlainInsertionInEveryIndex)
{
    for (const auto& [what, coordinates] : inputs<2>())
        comparesToPlain<2>(what, coordinates);
    for (const auto& [what, coordinates] : inputs<3>())
        comparesToPlain<3>(what, coordinates);
    for (const int n : {700, 1300})  // the cavity of the second is too large
        comparesToPlain<2>("fan", roundAndCenter<2>(n));
}

/// Every part is turned the right way and has a circle through its corners with no point within; their volumes add up
/// to that of the unit square or cube, whose corners are among the points.
template <int Size, typename Vector, typename Triangulate>
void fillsTheUnitBox(int n, Triangulate triangulate)
{
    std::mt19937 random(8);
    std::uniform_real_distribution<float> places(0, 1);
    std::vector<Point<Size>> points(n);
    for (int i = 0; i < n; ++i)
        for (int axis = 0; axis < Size; ++axis)
            points[i][axis] = i < 1 << Size ? static_cast<float>(i >> axis & 1) : places(random);
    KpDArray<Simplex<Size>> parts;
    ASSERT_TRUE(triangulate(reinterpret_cast<Vector*>(points.data()), n, parts));
    double sum = 0;
    for (const Simplex<Size>& part : parts) {
        Face<Size> face;
        std::copy_n(part.begin(), Size, face.begin());
        const Circle<Size> circle = circleThrough<Size>(points.data(), face, part[Size]);
        std::array<Position<Size>, Size> sides;
        for (int k = 0; k < Size; ++k)
            for (int axis = 0; axis < Size; ++axis)
                sides[k][axis] = double{points[part[k]][axis]} - points[part[Size]][axis];
        ASSERT_GT(determinant(sides), 0);
        sum += determinant(sides);
        for (int i = 0; i < n; ++i) {
            double d = 0;
            for (int axis = 0; axis < Size; ++axis)
                d += std::pow(points[i][axis] - circle.center[axis], 2);
            const double outside = std::sqrt(d) - std::sqrt(circle.squaredRadius);
            ASSERT_GT(outside, -1e-5) << i;
            ASSERT_TRUE(outside < 1e-5 || std::count(part.begin(), part.end(), i) == 0) << i;
        }
    }
    EXPECT_NEAR(sum, Size == 2 ? 2 : 6, 1e-2);
}

/// Asks for the outermost points of each circle, wherever the roundings of its test put them.
template <int Size>
void findsTheRimsOfCircles()
{
    std::mt19937 random(3);
    std::uniform_real_distribution<double> places(-1, 1), exponents(-20, 3);
    CircleGrid<Size> grid(400, 1e6F, circleScanPaths<Size>()[0].run);
    std::vector<Circle<Size>> circles(1000);
    for (int i = 0; i < 1000; ++i) {
        circles[i].squaredRadius = std::pow(10, exponents(random));
        for (double& x : circles[i].center)  // many end at a border between cells
            x = i % 4 == 0 ? 1 + std::sqrt(circles[i].squaredRadius) : places(random);
        grid.insert(i, circles[i]);
    }
    for (int i = 0; i < 1000; i += 3)
        grid.remove(i);
    for (int i = 0; i < 1000; ++i)
        for (int side = 0; side < 2 * Size; ++side) {
            Position<Size> point = circles[i].center;
            double& x = point[side / 2];
            double inside = x, outside = x + (side % 2 == 0 ? -2 : 2) * std::sqrt(circles[i].squaredRadius);
            for (int halvings = 0; halvings < 1100; ++halvings) {  // down to neighbours, even beside zero
                x = (inside + outside) / 2;
                double& bound = contains<Size>(circles[i], point) ? inside : outside;
                bound = x;
            }
            x = inside;
            std::int32_t hits[5000];
            const long found = grid.find(point, 5000, hits);
            ASSERT_EQ(std::count(hits, hits + found, i) > 0, i % 3 != 0) << i << ' ' << side;
        }
}

TEST(KpDelaunay, findsCirclesToTheLastBit)
{
    findsTheRimsOfCircles<2>();
    findsTheRimsOfCircles<3>();
}

TEST(KpDelaunay, keepsPointsOutOfCircles)
{
    fillsTheUnitBox<2, KpVec2f>(1500, KpDelaunay::triangulate2D);
    fillsTheUnitBox<3, KpVec3f>(300, KpDelaunay::triangulate3D);
    EXPECT_TRUE((contains<2>({{1, 1}, 25}, {4, 5})));  // on the circle
    EXPECT_FALSE((contains<2>({{1, 1}, std::nextafter(25.0, 0)}, {4, 5})));
    EXPECT_TRUE((contains<2>({{1, 1}, nan}, {4, 5})));
}

TEST(KpDelaunay, shiftsACopyAndRestartsTheSystemsGenerator)
{
    Coordinates zeros(2000);
    zeros.back() = 8;
    const auto many = shifted<2>(zeros.data(), 1000);
    EXPECT_EQ(many.range, 8);
    for (int axis = 0; axis < 2; ++axis) {
        const auto less = [axis](const Point<2>& a, const Point<2>& b) { return a[axis] < b[axis]; };
        const auto [low, high] = std::minmax_element(many.points.begin(), many.points.begin() + 999, less);
        EXPECT_NEAR((*low)[axis], -3.9e-8, 1e-9);
        EXPECT_NEAR((*high)[axis], 3.9e-8, 1e-9);
    }
    Coordinates points = {0, 0, 1, 2, 4, 8};
    const Point<2> corners[] = {{200, -80}, {-40, 400}, {-40, -80}};
    EXPECT_TRUE(std::equal(corners, corners + 3, &shifted<2>(points.data(), 3).points[3]));
    const Coordinates solid = {1, 2, 3, 2, 4, 7};
    const Point<3> corners3[] = {{801, -198, -397}, {-99, 1602, -397}, {-99, -198, 3203}, {-99, -198, -397}};
    EXPECT_TRUE(std::equal(corners3, corners3 + 4, &shifted<3>(solid.data(), 2).points[2]));

    KpDArray<KpDelaunay::Triangle> triangles;
    const Coordinates before = points;
    KpDelaunay::triangulate2D(reinterpret_cast<KpVec2f*>(points.data()), 3, triangles);
    const int drawn = std::rand();
    std::srand(367);
    EXPECT_EQ(drawn, std::rand());
    EXPECT_EQ(points, before);
}

TEST(KpDelaunay, refusesALargeCavity)
{
    Coordinates fan = roundAndCenter<2>(3000);
    Coordinates ball = roundAndCenter<3>(9000);
    KpDArray<KpDelaunay::Triangle> triangles{{1, 2, 3}};
    KpDArray<KpDelaunay::Tetrahedron> tetrahedra{{1, 2, 3, 4}};
    const LogCapture log;
    EXPECT_FALSE(KpDelaunay::triangulate2D(reinterpret_cast<KpVec2f*>(fan.data()), 3001, triangles));
    EXPECT_FALSE(KpDelaunay::triangulate3D(reinterpret_cast<KpVec3f*>(ball.data()), 9001, tetrahedra));
    EXPECT_EQ(log.lines(), Lines{"E [] temporary storage exceeded\n"});  // in the plane only
    EXPECT_EQ(std::tuple(triangles.size(), tetrahedra.size()), std::tuple(1, 1));
}

template <int Size>
void fillsRim(int limit)
{
    CavityRim<Size> rim;
    for (int round = 0; round < 2; ++round, rim.clear()) {
        for (int i = 0; i < limit; ++i)
            ASSERT_TRUE(rim.flip({i / 100, i % 100}));
        EXPECT_FALSE(rim.flip({-1, 0}));
        EXPECT_TRUE(rim.flip({0, 5}));  // taken out
        EXPECT_EQ(rim.begin()[5], (Face<Size>{(limit - 1) / 100, (limit - 1) % 100}));
        EXPECT_TRUE(rim.flip({-1, 0}));
        EXPECT_EQ(rim.size(), limit);
    }
}

TEST(KpDelaunay, boundsTheRim)
{
    fillsRim<2>(1025);
    fillsRim<3>(16385);
    CavityRim<2> rim;
    for (const Face<2>& face : {Face<2>{1, 2}, {3, 4}, {1, 2}, {5, 6}, {1, 2}})
        rim.flip(face);  // two faces aren't searched, and of equals the first goes
    EXPECT_EQ(std::vector(rim.begin(), rim.end()), (std::vector<Face<2>>{{5, 6}, {3, 4}, {1, 2}}));
}

TEST(KpDelaunay, drawsItsTriangles)
{
    const TempFolder folder;
    const std::string path = folder / "mesh.eps";
    KpVec2f points[] = {{5, 3}, {1, 3}, {1, 1}, {5, 1}}, upright[] = {{1, 1}, {1, 5}, {3, 5}, {3, 1}};
    KpDArray<KpDelaunay::Triangle> triangles{{0, 1, 2}, {0, 2, 3}};
    const std::string head = "%!PS-Adobe-2.0 EPSF-2.0\n%%BoundingBox: 84 207 511 634\n/M  { moveto } bind def\n"
                             "/L { lineto } bind def\n/CS { closepath stroke } bind def\n85 208 translate\n"
                             "425 425 scale\n";
    ASSERT_TRUE(KpDelaunay::writeEPS(path.c_str(), points, 4, triangles));
    EXPECT_EQ(contentOf(path), head + "0 0.25 translate\n0.25 0.25 scale\n0 setlinewidth\n"
                                      "4 2 M 0 2 L 0 0 L CS\n4 2 M 0 0 L 4 0 L CS\nshowpage\n");
    triangles.clear();
    ASSERT_TRUE(KpDelaunay::writeEPS(path.c_str(), upright, 4, triangles));
    EXPECT_EQ(contentOf(path), head + "0.25 0 translate\n0.25 0.25 scale\n0 setlinewidth\nshowpage\n");
    ASSERT_TRUE(KpDelaunay::writeEPS(path.c_str(), nullptr, 0, triangles));
    EXPECT_EQ(contentOf(path), head + "showpage\n");
    EXPECT_FALSE(KpDelaunay::writeEPS((folder / "no/where").c_str(), points, 4, triangles));
}

}  // namespace
