#include <kplib/system/KpBuildInfo.h>
#include <kplib/system/KpVersion.h>

#include <gtest/gtest.h>

#include <locale>
#include <regex>

TEST(KpVersion, readsNumbersJoinedByDots)
{
    const std::pair<const char*, const char*> cases[] = {{"7.100", "7.100.0.0"},
                                                         {"7", "7.0.0.0"},
                                                         {"1.2.3.4.5", "1.2.3.4"},
                                                         {" 1. 2", "1.2.0.0"},
                                                         {"", "0.0.0.0"},
                                                         {"1.2.", "0.0.0.0"},
                                                         {"1.4294967296", "0.0.0.0"},
                                                         {"1.x", "0.0.0.0"},
                                                         {"1 .2", "0.0.0.0"},
                                                         {"4294967295", "4294967295.0.0.0"}};
    struct DotBetweenThousands : std::numpunct<char> {
        char do_thousands_sep() const override { return '.'; }
        std::string do_grouping() const override { return "\3"; }
    };
    for (const std::locale& locale : {std::locale(), std::locale(std::locale(), new DotBetweenThousands)}) {
        const std::locale before = std::locale::global(locale);
        for (const auto& [text, expected] : cases)
            EXPECT_EQ(KpVersion(text).toString(), expected) << text;
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
    EXPECT_EQ(ascending[5].asKpVec4i(), KpVec4i(1, INT32_MIN, 0, 0));
}

TEST(KpBuildInfo, tellsWhatTheBuildHasSet)
{
    const KpVersion version(KpBuildInfo::getBuildTag("VERSION_STRING"));
    const std::string three = version.toString().substr(0, version.toString().rfind('.'));
    const std::string build = "Build " + KpBuildInfo::getBuildTag("VERSION_BUILD");
    const std::string time = KpBuildInfo::getBuildTag("VERSION_BUILD_TIME");
    EXPECT_TRUE(std::regex_match(time, std::regex(R"(\d{4}-[A-Z][a-z]{2}-\d\d \d\d:\d\d:\d\d)"))) << time;
    const std::pair<int, std::string> strings[] = {{1, version.toString()},
                                                   {4, three + " (Linux, 64-bit " + build + ")"},
                                                   {8, three + " (" + build + ", " + time + ")"},
                                                   {9, version.toString() + " (" + time + ")"}};
    for (const auto& [flags, expected] : strings)
        EXPECT_EQ(KpBuildInfo::getBuildString(flags), expected) << flags;
}
