#include <kplib/imaging/KpColor.h>

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <limits>

TEST(KpColor, readsTexts)
{
    const float grey = 128 / 255.0f;
    const struct {
        const char* text;
        bool ok;
        KpColor color;
    } cases[] = {
        {"0.5", true, {0.5f, 0.5f, 0.5f}},
        {" \t128", true, {grey, grey, grey}},
        {"255 0 0", true, {1, 0, 0}},
        {"1 0 0", true, {1, 0, 0}},
        {"#FF8000", true, {1, grey, 0}},
        {"#1FF8000", true, {1, grey, 0}},
        {"0.25 0.5", false, {0.25f, 0.5f, 9}},
        {"0.25 0.5 x", false, {0.25f, 0.5f, 9}},
        {"red", false, {0, 0, 0}},
        {".5", false, {0, 0, 0}},
        {"-1 0 0", false, {0, 0, 0}},
        {"", false, {0, 0, 0}},
        {nullptr, false, {0, 0, 0}},
        {"#", false, {0, 0, 0}},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.text ? c.text : "null");
        KpColor color(9, 9, 9);
        EXPECT_EQ(color.setValue(c.text), c.ok);
        EXPECT_EQ(color, c.color) << color[0] << ' ' << color[1] << ' ' << color[2];
    }
    const char* const words[] = {"0.5", "0.25", "1"};
    KpColor joined;
    EXPECT_TRUE(joined.setValue(3, words));
    EXPECT_EQ(joined, KpColor(0.5f, 0.25f, 1));
    joined.setValue(0xFF8001u);
    EXPECT_TRUE(joined.equals(KpColor(1, grey, 1 / 255.0f), 1e-6f));
    EXPECT_FALSE(joined.equals(KpColor(1, grey, 0), 1e-6f));
}

TEST(KpColor, asksTheHookForNames)
{
    KpColor::getColorFromName = [](float* red, float* green, float* blue, const char* name) {
        *red = name[0] == 'r' ? 1 : 0.5f;
        *green = *blue = 0;
    };
    KpColor color;
    EXPECT_TRUE(color.setValue("  red"));
    EXPECT_EQ(color, KpColor(1, 0, 0));
    KpColor::getColorFromName = nullptr;
    EXPECT_FALSE(color.setValue("red"));
}

TEST(KpColor, convertsHueSaturationValue)
{
    const float inf = std::numeric_limits<float>::infinity();
    const struct {
        float h, s, v;
        KpColor color;
    } cases[] = {
        {0, 1, 1, {1, 0, 0}},        {1 / 6.0f, 1, 1, {1, 1, 0}},         {1 / 3.0f, 1, 1, {0, 1, 0}},
        {0.5f, 1, 1, {0, 1, 1}},     {2 / 3.0f, 1, 1, {0, 0, 1}},         {5 / 6.0f, 0.5f, 0.8f, {0.8f, 0.4f, 0.8f}},
        {1.25f, 1, 1, {0.5f, 1, 0}}, {-0.25f, 1, 1, {0.5f, 0, 1}},        {-1e-12f, 1, 1, {1, 0, 0}},
        {1e30f, 1, 1, {1, 0, 0}},    {0.3f, 0, 0.7f, {0.7f, 0.7f, 0.7f}}, {inf, 1, 1, {9, 9, 9}},
    };
    for (const auto& c : cases) {
        KpColor color(9, 9, 9);
        color.setHSVValue(c.h, c.s, c.v);
        EXPECT_TRUE(color.equals(c.color, 2e-6f)) << c.h << ": " << color[0] << ' ' << color[1] << ' ' << color[2];
    }
    for (float h = 0; h < 0.99f; h += 0.03f) {
        KpColor color;
        float back = -1, s = -1, v = -1;
        color.setHSVValue(h, 0.6f, 0.9f);
        color.getHSVValue(back, s, v);
        EXPECT_NEAR(back, h, 1e-5f);
        EXPECT_NEAR(s, 0.6f, 1e-5f);
        EXPECT_EQ(v, 0.9f);
    }
    float h = 9, s = 9, v = 9;
    KpColor().getHSVValue(h, s, v);
    EXPECT_EQ(h + s + v, 0);

    srand48(1);
    double hue = 0;
    KpColor random, expected;
    for (int i = 0; i < 100; ++i)
        random.setRandomColor();
    srand48(1);
    for (int i = 0; i < 100; ++i)
        hue = std::fmod(hue + drand48(), 1.0);
    expected.setHSVValue(static_cast<float>(hue), 0.8f, 0.8f);
    EXPECT_TRUE(random.equals(expected, 1e-4f));
}

TEST(KpColor, convertsToCIELab)
{
    // sRGB red, white and a dark grey in L*a*b* of D65, as colour-science tables give them.
    const struct {
        KpColor color;
        float L, a, b;
    } cases[] = {{{1, 0, 0}, 53.24f, 80.09f, 67.20f}, {{1, 1, 1}, 100, 0, 0}, {{0, 0, 0}, 0, 0, 0}};
    for (const auto& c : cases) {
        float L = -1, a = -1, b = -1;
        c.color.getCIELabValue(L, a, b);
        EXPECT_NEAR(L, c.L, 0.05f);
        EXPECT_NEAR(a, c.a, 0.05f);
        EXPECT_NEAR(b, c.b, 0.05f);
    }
    for (int i = 0; i < 125; ++i) {
        const KpColor color(static_cast<float>(i % 5) / 4, static_cast<float>(i / 5 % 5) / 4,
                            static_cast<float>(i / 25) / 4);
        float L = 0, a = 0, b = 0;
        KpColor back;
        color.getCIELabValue(L, a, b);
        back.setCIELabValue(L, a, b);
        EXPECT_TRUE(back.equals(color, 2e-3f)) << i << ": " << back[0] << ' ' << back[1] << ' ' << back[2];
    }
}

TEST(KpColor, tellsOfClampedBlueOnly)
{
    float black[] = {0, 0, 0}, red[] = {41.24f, 21.26f, 1.93f}, grey[] = {20, 21, 22}, rgb[3];
    EXPECT_TRUE(XYZ2rgb(black, rgb));
    EXPECT_FALSE(XYZ2rgb(grey, rgb));
    float saturated[] = {95, 0, 20};  // red far above 1, green below 0, blue within
    EXPECT_FALSE(XYZ2rgb(saturated, rgb));
    EXPECT_EQ(rgb[0], 1);
    EXPECT_EQ(rgb[1], 0);
    float blue[] = {0, 0, 200};
    EXPECT_TRUE(XYZ2rgb(blue, rgb));
    XYZ2rgb(red, rgb);
    EXPECT_NEAR(rgb[0], 1, 1e-3f);
}
