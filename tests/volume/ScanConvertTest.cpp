#include <kplib/volume/KpScanConvert.h>

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>
#include <string>
#include <vector>

namespace {

using Polygon = std::vector<KpVec2f>;

/// What a scan reports: one text a row of the window, '#' for a pixel.
struct Raster {
    Raster(int w, int h) : rows(std::size_t(h), std::string(std::size_t(w), '.')) {}

    static void onSpan(void* raster, int xLeft, int xRight, int y)
    {
        auto& self = *static_cast<Raster*>(raster);
        EXPECT_LE(xLeft, xRight);
        EXPECT_TRUE(y > self.lastY || (y == self.lastY && xLeft >= self.lastX)) << "not in order";
        self.lastY = y;
        self.lastX = xRight;
        for (int x = xLeft; x <= xRight; ++x)
            onPixel(raster, x, y);
    }
    static void onPixel(void* raster, int x, int y)
    {
        static_cast<Raster*>(raster)->rows.at(std::size_t(y)).at(std::size_t(x)) = '#';
    }

    std::vector<std::string> rows;
    int lastX = -1, lastY = -1;
};

Raster scanned(const Polygon& polygon, int w, int h)
{
    Raster raster(w, h);
    KpScanConvert scan(0, 0, w - 1, h - 1);
    scan.setSpanCB(Raster::onSpan, &raster);
    scan.render(static_cast<int>(polygon.size()), polygon.data());
    return raster;
}

/// Even-odd at the middle of a pixel; 0 where an edge is too near to decide.
int side(const Polygon& polygon, int px, int py)
{
    const double x = px + 0.5, y = py + 0.5;
    bool isInside = false;
    for (std::size_t i = 0; i < polygon.size(); ++i) {
        const KpVec2f &a = polygon[i], &b = polygon[(i + 1) % polygon.size()];
        if (std::abs(a.y() - y) < 1e-3)
            return 0;
        if ((a.y() > y) == (b.y() > y))
            continue;
        const double crossing = a.x() + (y - a.y()) * (double{b.x()} - a.x()) / (double{b.y()} - a.y());
        if (std::abs(crossing - x) < 1e-3)
            return 0;
        isInside ^= crossing > x;
    }
    return isInside ? 1 : -1;
}

}  // namespace

TEST(KpScanConvert, agreesWithTheEvenOddRuleAtEachPixel)
{
    std::mt19937 random(3);
    std::uniform_real_distribution<float> place(-8, 40);
    for (int round = 0; round < 400; ++round) {
        const int w = 1 + static_cast<int>(random() % 33), h = 1 + static_cast<int>(random() % 33);
        Polygon polygon(3 + random() % (round % 50 == 0 ? 3000 : 12));
        for (KpVec2f& vertex : polygon)
            vertex = round % 3 == 0 ? KpVec2f(std::round(place(random)), std::round(place(random)) + 0.25F)
                                    : KpVec2f(place(random), place(random));
        const Raster raster = scanned(polygon, w, h);
        for (int i = 0; i < w * h && polygon.size() <= 100; ++i) {
            const char actual = raster.rows[std::size_t(i / w)][std::size_t(i % w)];
            const int expected = side(polygon, i % w, i / w);
            ASSERT_TRUE(expected == 0 || actual == (expected > 0 ? '#' : '.')) << round << ": " << i;
        }
    }
}

TEST(KpScanConvert, reportsMiddlesOfPixelsWithinTheWindow)
{
    constexpr float inf = std::numeric_limits<float>::infinity(), NaN = std::numeric_limits<float>::quiet_NaN();
    const std::tuple<const char*, Polygon, std::vector<std::string>> cases[] = {
        {"between the middles", {{0.6F, 0.6F}, {1.4F, 0.6F}, {1.4F, 1.4F}, {0.6F, 1.4F}}, {"....", "....", "...."}},
        {"two vertices", {{0, 0}, {4, 4}}, {"....", "....", "...."}},
        {"notch from above",
         {{0, 0}, {1, 0}, {1, 1}, {2, 1}, {2, 0}, {4, 0}, {4, 2}, {0, 2}},
         {"#.##", "####", "...."}},
        {"far beyond", {{-3e9F, -3e9F}, {3e9F, -3e9F}, {3e9F, 3e9F}, {-3e9F, 3e9F}}, {"####", "####", "####"}},
        {"not finite", {{NaN, 0}, {2, NaN}, {inf, 1}, {-inf, 3}, {1, inf}, {1, -inf}}, {}},
    };
    for (const auto& [what, polygon, expected] : cases) {
        const Raster raster = scanned(polygon, 4, 3);
        EXPECT_TRUE(expected.empty() || raster.rows == expected) << what;
    }
}

TEST(KpScanConvert, handsPixelsOnUnlessSpansAreWanted)
{
    const Polygon square = {{0, 0}, {2, 0}, {2, 2}, {0, 2}};
    Raster pixels(4, 4), spans(4, 4);
    KpScanConvert scan(0, 0, 3, 3);
    scan.render(4, square.data());  // no callback is set
    scan.setPixelCB(Raster::onPixel, &pixels);
    scan.render(4, square.data());
    EXPECT_EQ(pixels.rows[1], "##..");
    scan.setSpanCB(Raster::onSpan, &spans);
    scan.setPixelCB([](void*, int, int) { FAIL(); }, &spans);
    scan.render(4, square.data());
    EXPECT_EQ(spans.rows[1], "##..");
}
