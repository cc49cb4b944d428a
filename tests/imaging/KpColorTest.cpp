#include <kplib/imaging/KpColor.h>

#include <gtest/gtest.h>

#include <limits>

TEST(KpColor, readsTexts)
{
    const float grey = 128 / 255.0f;
    const std::tuple<const char*, bool, KpColor> cases[] = {{"1 0.5 0", true, {1, 0.5f, 0}},
                                                            {" \t128", true, {grey, grey, grey}},
                                                            {"255 0 0", true, {1, 0, 0}},
                                                            {"#1FF8000", true, {1, grey, 0}},
                                                            {"0.25 0.5 x", false, {0.25f, 0.5f, 9}},
                                                            {"red", false, {0, 0, 0}},
                                                            {".5", false, {0, 0, 0}},
                                                            {"", false, {0, 0, 0}},
                                                            {"#", false, {0, 0, 0}}};
    for (const auto& [text, ok, expected] : cases) {
        KpColor color(9, 9, 9);
        EXPECT_EQ(color.setValue(text), ok) << text;
        EXPECT_EQ(color, expected) << text << ": " << color[0] << ' ' << color[1] << ' ' << color[2];
    }
    const char* const words[] = {"0.5", "0.25", "1"};
    KpColor color;
    EXPECT_TRUE(color.setValue(3, words));
    EXPECT_EQ(color, KpColor(0.5f, 0.25f, 1));
    color.setValue(0xFF8001);
    EXPECT_TRUE(color.equals(KpColor(1, grey, 1 / 255.0f), 1e-6f));
    EXPECT_FALSE(color.equals(KpColor(1, grey, 0), 1e-6f));
    KpColor::getColorFromName = [](float* red, float*, float*, const char* name) { *red = name[0] == 'r' ? 0.5f : 0; };
    EXPECT_TRUE(color.setValue("  red"));
    EXPECT_EQ(color.red(), 0.5f);
    KpColor::getColorFromName = nullptr;
}

TEST(KpColor, convertsHueSaturationValue)
{
    const float inf = std::numeric_limits<float>::infinity();
    const std::tuple<float, float, float, KpColor> cases[] = {
        {0, 1, 1, {1, 0, 0}},        {1 / 6.0f, 1, 1, {1, 1, 0}},         {1 / 3.0f, 1, 1, {0, 1, 0}},
        {0.5f, 1, 1, {0, 1, 1}},     {2 / 3.0f, 1, 1, {0, 0, 1}},         {5 / 6.0f, 0.5f, 1, {1, 0.5f, 1}},
        {1.25f, 1, 1, {0.5f, 1, 0}}, {-0.25f, 1, 1, {0.5f, 0, 1}},        {-1e-12f, 1, 1, {1, 0, 0}},
        {1e30f, 1, 1, {1, 0, 0}},    {0.3f, 0, 0.7f, {0.7f, 0.7f, 0.7f}}, {inf, 1, 1, {9, 9, 9}}};
    for (const auto& [h, s, v, expected] : cases) {
        KpColor color(9, 9, 9);
        color.setHSVValue(h, s, v);
        EXPECT_TRUE(color.equals(expected, 2e-6f)) << h << ": " << color[0] << ' ' << color[1] << ' ' << color[2];
    }
    float back = 9, s = 9, v = 9;
    KpColor color;
    color.getHSVValue(back, s, v);
    EXPECT_EQ(back + s + v, 0);
    for (float h = 0; h < 0.99f; h += 0.03f) {
        color.setHSVValue(h, 0.6f, 0.9f);
        color.getHSVValue(back, s, v);
        EXPECT_TRUE(KpColor(back, s, v).equals(KpColor(h, 0.6f, 0.9f), 1e-5f)) << h;
    }
}

TEST(KpColor, convertsToCIELab)
{
    float L = 0, a = 0, b = 0;
    KpColor(1, 0, 0).getCIELabValue(L, a, b);  // with the white of D65, as tables give it
    EXPECT_TRUE(KpColor(L, a, b).equals(KpColor(53.24f, 80.09f, 67.20f), 0.05f));
    for (int i = 0; i < 125; ++i) {
        const KpColor color(i % 5 / 4.0f, i / 5 % 5 / 4.0f, i / 25 / 4.0f);
        KpColor back;
        color.getCIELabValue(L, a, b);
        back.setCIELabValue(L, a, b);
        EXPECT_TRUE(back.equals(color, 2e-3f)) << i << ": " << back[0] << ' ' << back[1] << ' ' << back[2];
    }
}

TEST(KpColor, tellsOfClampedBlueOnly)
{
    float black[] = {0, 0, 0}, redOnly[] = {95, 0, 20}, blue[] = {0, 0, 200}, rgb[3];
    EXPECT_TRUE(XYZ2rgb(black, rgb));
    EXPECT_TRUE(XYZ2rgb(blue, rgb));
    EXPECT_FALSE(XYZ2rgb(redOnly, rgb)) << "red far above 1, green below 0, blue within";
    EXPECT_EQ(std::tuple(rgb[0], rgb[1]), std::tuple(1, 0));
}
