#include <kplib/imaging/KpWindowLevel.h>

#include <gtest/gtest.h>

namespace {

using Presets = std::vector<KpWindowLevel>;

/// The presets as texts "centre/width/explanation ...".
std::string shown(const Presets& presets)
{
    std::string text;
    for (const KpWindowLevel& each : presets)
        text += each.centerString() + '/' + each.widthString() + '/' + each.explanation() + ' ';
    return text;
}

TEST(WindowLevel, presetsComeFromTheValuesAtOnePosition)
{
    const char* const cases[][4] = {
        {R"(40\50)", "400", "", ""},
        {R"(1\2)", R"(3\4)", R"(A\B\C)", "1/3/A 2/4/B "},
        {R"(1\2)", R"(3\4)", "A", "1/3/A 2/4/ "},
        {R"(1\\3)", R"(4\5\6)", R"(A\B\C)", "1/4/A 3/6/C "},
        {R"(1\2)", R"(\4)", R"(A\B)", "2/4/B "},
        {"", "", "", ""},
        {"40 ", " 400", "", "40 / 400/ "},  // blanks stay as they are
    };
    for (const auto& [center, width, explanation, presets] : cases)
        EXPECT_EQ(shown(KpWindowLevel::createFromTags(std::array<std::string, 3>{center, width, explanation})),
                  presets);
}

TEST(WindowLevel, tagsKeepTheTextsAndTheirPlaces)
{
    const Presets presets = {{"40", "400.50"}, {"-6e2", "1600", "LUNG"}};
    const auto tags = KpWindowLevel::toTags(presets);
    EXPECT_EQ(tags.toArray(), (std::array<std::string, 3>{R"(40\-6e2)", R"(400.50\1600)", R"(\LUNG)"}));
    EXPECT_EQ(shown(KpWindowLevel::createFromTags(tags)), shown(presets));
    EXPECT_EQ(KpWindowLevel::toTags({}).toArray(), (std::array<std::string, 3>{}));
}

TEST(WindowLevel, equalityIsThatOfNumbers)
{
    KpWindowLevel preset("1", "2", "A");
    preset.setCenter(40);
    preset.setWidth(0.1F);
    EXPECT_EQ(shown({preset}), "40.000000/0.100000/A ");
    for (const auto& [width, text] : {std::pair("1e-1", "A"), {"0.1", "B"}, {"0.2", "A"}})
        EXPECT_EQ(preset == KpWindowLevel("40", width, text), *width == '1') << width << text;
    const KpWindowLevel nan("nan", "1");
    EXPECT_FALSE(nan == nan);
    EXPECT_TRUE(KpWindowLevel("x", "y") == KpWindowLevel("0", "0"));
    EXPECT_EQ(KpWindowLevel("", " 2.5 ").width(), 2.5F);
}

TEST(WindowLevel, mergingFoldsNeighboursOnly)
{
    const Presets one = {{"1", "2"}}, same = {{"1.0", "2"}}, two = {{"1", "2"}, {"3", "4"}};
    EXPECT_EQ(shown(KpWindowLevel::merge(one, same)), "1/2/ ");
    EXPECT_EQ(KpWindowLevel::merge(two, two).size(), 4U);
}

}  // namespace
