#include <kplib/system/KpBuildInfo.h>
#include <kplib/system/KpVersion.h>

#include <gtest/gtest.h>

#include <locale>
#include <regex>

TEST(KpVersion, readsNumbersJoinedByDots)
{
    const struct {
        const char *text, *expected;
    } cases[] = {
        {"1.2", "1.2.0.0"},       {"7.100", "7.100.0.0"},      {"7", "7.0.0.0"},
        {"1.2.3.4.5", "1.2.3.4"}, {"1.2.3.4x", "1.2.3.4"},     {" 1. 2", "1.2.0.0"},
        {"", "0.0.0.0"},          {"1.2.", "0.0.0.0"},         {"1.x", "0.0.0.0"},
        {"1 .2", "0.0.0.0"},      {"1.2 ", "0.0.0.0"},         {"a", "0.0.0.0"},
        {"1..2", "0.0.0.0"},      {"1.4294967296", "0.0.0.0"}, {"4294967295", "4294967295.0.0.0"},
    };
    struct DotBetweenThousands : std::numpunct<char> {
        char do_thousands_sep() const override { return '.'; }
        std::string do_grouping() const override { return "\3"; }
    };
    for (const std::locale& locale : {std::locale(), std::locale(std::locale(), new DotBetweenThousands)}) {
        const std::locale before = std::locale::global(locale);
        for (const auto& c : cases)
            EXPECT_EQ(KpVersion(c.text).toString(), c.expected) << c.text;
        std::locale::global(before);
    }
}

TEST(KpVersion, isOrderedPartByPartAsUnsigned)
{
    const KpVersion ascending[] = {{},           {0, 0, 0, 1},          {1, 2, 0, 0}, {1, 2, 0, 1},
                                   {1, 3, 0, 0}, {1, 0x80000000, 0, 0}, {2, 0, 0, 0}};
    for (int i = 0; i < 7; ++i) {
        for (int j = 0; j < 7; ++j) {
            EXPECT_EQ(ascending[i] < ascending[j], i < j);
            EXPECT_EQ(ascending[i] == ascending[j], i == j);
            EXPECT_EQ(ascending[i].isBetween(ascending[1], ascending[j]), i >= 1 && i <= j);
        }
    }
    EXPECT_EQ(ascending[3].firstMismatchingValues({1, 2, 5, 7}), std::pair(0U, 5U));
    EXPECT_EQ(ascending[3].firstMismatchingValues(ascending[3]), std::pair(0U, 0U));
    EXPECT_TRUE(ascending[2].sameMajorMinor(ascending[3]));
    EXPECT_EQ(ascending[5].asKpVec4i(), KpVec4i(1, INT32_MIN, 0, 0));
}

TEST(KpBuildInfo, tellsWhatTheBuildHasSet)
{
    int v[4];
    KpBuildInfo::getVersion(v);
    const KpVersion version(KpBuildInfo::getBuildTag("VERSION_STRING"));
    for (int i = 0; i < 4; ++i)
        EXPECT_EQ(version.asKpVec4i()[i], v[i]);
    const std::string three = version.toString().substr(0, version.toString().rfind('.'));
    const std::string build = "Build " + KpBuildInfo::getBuildTag("VERSION_BUILD");
    const std::string time = KpBuildInfo::getBuildTag("VERSION_BUILD_TIME");
    EXPECT_TRUE(std::regex_match(time, std::regex(R"(\d{4}-[A-Z][a-z]{2}-\d\d \d\d:\d\d:\d\d)"))) << time;
    EXPECT_TRUE(std::regex_match(KpBuildInfo::getBuildTag("VERSION_SHA1"), std::regex("[0-9a-f]{40}")));
    EXPECT_EQ(KpBuildInfo::getBuildTag("VERSION"), "");
    const std::pair<int, std::string> strings[] = {
        {0, three + " (" + build + ")"},
        {1, version.toString()},
        {4, three + " (Linux, 64-bit " + build + ")"},
        {5, version.toString() + " (Linux, 64-bit)"},
        {8, three + " (" + build + ", " + time + ")"},
        {9, version.toString() + " (" + time + ")"},
    };
    for (const auto& [flags, expected] : strings)
        EXPECT_EQ(KpBuildInfo::getBuildString(flags), expected) << flags;
    if (KpBuildInfo::getBuildTag("VERSION_COMMENTS").empty()) {
        EXPECT_EQ(KpBuildInfo::getBuildString(3), version.toString() + " ()");
    }
}
