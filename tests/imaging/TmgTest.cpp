#include <kplib/kplib.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <random>

namespace {

TEST(TmgDateTime, datesGoThereAndBack)
{
    const std::pair<long, const char*> cases[] = {
        {20240315, "2024-MAR-15"},
        {20241231, "2024-DEC-31"},
        {20240001, "2024-DEC-01"},
        {20241301, "2024-DEC-01"},
        {1234567, ""},
        {202403151, "2024-MAR-151"},
    };
    for (const auto& [date, text] : cases)
        EXPECT_EQ(Tmg::dateReformat(date), text);
    const std::pair<const char*, long> texts[] = {
        {"2024-mar-15", 20240315}, {"2024-DEC-31", 20241231}, {"2024-XYZ-15", 0},
        {"20240315", 20240315},    {"2024-MAR-", 202403},     {"2024-MAR-1523", 20240315},
    };
    for (const auto& [text, date] : texts)
        EXPECT_EQ(Tmg::dateReformat(std::string(text)), date) << text;

    Tmg::SetFuncDateReformatLong([](long) { return std::string("hook"); });
    Tmg::SetFuncDateReformatString([](const std::string&) { return 7L; });
    EXPECT_EQ(Tmg::dateReformat(20240315), "hook");
    EXPECT_EQ(Tmg::dateReformat(std::string()), 7);
    Tmg::SetFuncDateReformatLong(nullptr);
    Tmg::SetFuncDateReformatString(nullptr);
}

TEST(TmgDateTime, timesAreFormattedAndMadeKeys)
{
    const std::pair<const char*, const char*> formatted[] = {
        {"123456.789", "12:34:56"}, {"1234567", "1234567"}, {"123456", "12:34:56"}, {"12345", "12345"}, {"", ""}};
    for (const auto& [time, text] : formatted)
        EXPECT_EQ(Tmg::timeReformat(time), text);
    const std::tuple<const char*, const char*, const char*> keys[] = {
        {"123456", "1123456123456.", "00116544."},
        {"123456.000000", "1123456123456.000000", "00116544.999999"},
        {"003456.25", "1003456003456.25", "00236544.1999874"},
        {"12345", "12345", "12345"},
        {"12345.6", "", ""},
    };
    for (const auto& [time, key, inverted] : keys) {
        EXPECT_EQ(Tmg::timeString(time, false), key);
        EXPECT_EQ(Tmg::timeString(time, true), inverted);
    }
    for (const auto& [zone, time] : {std::pair("XYZ-3", 53206L), std::pair("UTC", 23206L)}) {
        setenv("TZ", zone, 1);
        EXPECT_EQ(Tmg::splitDateTime(1710469926), std::pair(20240315L, time));
    }
    using Texts = std::pair<std::string, std::string>;
    EXPECT_EQ(Tmg::splitAndReformatDateTime("20240315 023206.5", ' '), Texts("2024-MAR-15", "02:32:06"));
    EXPECT_EQ(Tmg::splitAndReformatDateTime("20240315", ' '), Texts());
    EXPECT_THROW(Tmg::splitAndReformatDateTime("x 1", ' '), std::invalid_argument);
}

/// The rules one after the other, with all tries.
bool plainMatch(const char* p, const char* t, char anyRun, char anyOne)
{
    if (!*p)
        return !*t;
    if (*p == anyRun)
        return plainMatch(p + 1, t, '*', '?') || (*t && plainMatch(p, t + 1, anyRun, anyOne));
    if (*p == anyOne)
        return *t && (plainMatch(p + 1, t + 1, '*', '?') || plainMatch(p + 1, t, '*', '?'));
    return *p == *t && plainMatch(p + 1, t + 1, '*', '?');
}

TEST(TmgText, patternsMatchAsTriedOneByOne)
{
    std::mt19937 random(8);
    const auto text = [&random](const char* letters, size_t most) {
        std::string made(random() % (most + 1), ' ');
        for (char& c : made)
            c = letters[random() % std::strlen(letters)];
        return made;
    };
    for (int i = 0; i < 20000; ++i) {
        const std::string pattern = text("ab*?%_", 6), subject = text("ab*%", 6);
        const bool expected = plainMatch(pattern.c_str(), subject.c_str(), '%', '_');
        ASSERT_EQ(Tmg::match(pattern.c_str(), subject.c_str(), '%', '_'), expected) << pattern << ' ' << subject;
    }
    EXPECT_TRUE(Tmg::match("a?b", "ab", '*', '?'));
    EXPECT_TRUE(Tmg::match("a?b", "axb", '*', '?'));
    EXPECT_FALSE(Tmg::match(std::string(2000, '*').append("b").c_str(), std::string(2000, 'a').c_str(), '*', '?'));
}

TEST(TmgText, setsAndValuesAreLists)
{
    EXPECT_TRUE(Tmg::matchSet("mr\\c*", "ct", "\\"));
    EXPECT_TRUE(Tmg::matchSet("A", "b a", " "));
    EXPECT_FALSE(Tmg::matchSet("mr", "ct", "\\") || Tmg::matchSet(nullptr, "a", " ") || Tmg::matchSet("a", "", " "));
    const std::tuple<const char*, const char*, const char*, const char*, bool> cases[] = {
        {"A\\B", "B\\C", "\\", "A\\B\\C", true}, {"A\\B", "A", "\\", "A\\B", false}, {"", "A", ",", "A", true},
        {"A;B", "C,D", ",;", "A;B;C;D", true},   {"A,", "B", ",", "A,B", true},      {"A", "B,B", ",", "A,B", true},
    };
    for (const auto& [before, additions, separators, result, added] : cases) {
        KpString target(before);
        EXPECT_EQ(Tmg::addToMultiValueString(target, additions, separators), added);
        EXPECT_STREQ(target, result);
    }
}

TEST(TmgImages, numbersComeFromTheListOrTheHeader)
{
    HxParamBundle object("Object");
    int number = 5;
    const auto numberOf = [&](int index) { return Tmg::imageNumber(object, index, number) ? number : -1 - number; };
    EXPECT_EQ(numberOf(0), -1) << "none, and set to 0";
    object.dicomAllCreate()->set("G0020-0013", "Instance Number: 42");
    EXPECT_EQ(numberOf(0), 42);

    HxParamBundle* list = object.bundle("ImageNumberList", 1);
    list->set("Old", 1);
    Tmg::setImageTagList(list, KpDArray<KpString>({"7,a", "8,b", "9"}));
    KpDArray<int> numbers;
    const std::tuple<int, int, std::vector<int>> cases[] = {
        {0, 2, {7, 8, 9}}, {-3, 99, {7, 8, 9}}, {1, 1, {8}}, {2, 1, {}}, {5, 9, {}}};
    for (const auto& [first, last, expected] : cases) {
        Tmg::imageNumbers3D(object, first, last, numbers);
        EXPECT_EQ(std::vector<int>(numbers.begin(), numbers.end()), expected);
    }
    EXPECT_EQ(std::pair(numberOf(0), numberOf(2)), std::pair(7, 9));
    for (const int index : {-1, 3, 0x7fffffff})
        EXPECT_FALSE(Tmg::imageNumberFromBundle(list, index, number));
    EXPECT_EQ(numberOf(3), 42);  // falls back on the header
    EXPECT_FALSE(list->isSorted());
    list->set("NumImageNumbers", 0);
    EXPECT_FALSE(Tmg::imageNumberFromBundle(list, 0, number));
}

TEST(TmgImages, framesAreNumberedInObjectsOfSeveral)
{
    HxParamBundle object("Object");
    int frame = 0;
    for (const char* single : {"Number of Frames: 1", "2", ":"}) {
        object.dicomAllCreate()->set("G0028-0008", single);
        EXPECT_FALSE(Tmg::frameNumber(object, true, 3, frame)) << single;
    }
    object.dicomAllCreate()->set("G0028-0008", "Number of Frames: 2");
    EXPECT_TRUE(Tmg::frameNumber(object, true, 3, frame));
    EXPECT_EQ(frame, 3);
    EXPECT_FALSE(Tmg::frameNumber(object, false, 0, frame));
    object.bundle("SOPInstanceUIDs", 1)->set("Image00001", "1.2.17");
    EXPECT_TRUE(Tmg::frameNumber(object, false, 0, frame));
    EXPECT_EQ(frame, 17);
}

TEST(TmgImages, tagsOfAnImageAreItsOwnOrTheVolumes)
{
    HxParamBundle object("Object");
    KpString value("old");
    bool approximate = false;
    using Answer = std::tuple<bool, bool, std::string>;  // whether it was found, whether it is approximate, the value
    const auto ask = [&](int index, const char* tag) {
        const bool isFound = Tmg::imageLevelTag(object, index, tag, value, approximate);
        return Answer(isFound, approximate, value.c_str());
    };
    EXPECT_EQ(ask(0, "G0018-0050"), Answer(false, false, "old"));  // constant in a volume
    object.dicomAllCreate()->set("G0008-0032", "Acquisition Time: 0815");
    EXPECT_EQ(ask(0, "G0008-0032"), Answer(true, true, "0815"));

    HxParamBundle* list = object.bundle("ImageNumberList", 1);
    Tmg::setImageTagList(list, KpDArray<KpString>({"1,10.5,", "2"}));
    object.set("ImageLevelTags", "G0020-0013,G0020-1041,G0018-1041");
    EXPECT_EQ(ask(0, "G0020-1041"), Answer(true, false, "10.5"));
    EXPECT_EQ(ask(1, "G0020-1041"), Answer(false, false, "10.5"));  // no such field: stays
    EXPECT_EQ(ask(0, "G0018-1041"), Answer(false, false, ""));      // an empty field
    EXPECT_EQ(ask(2, "G0020-0013"), Answer(false, false, ""));
    EXPECT_EQ(ask(0, "1041"), Answer(false, false, ""));  // part of a name
    EXPECT_EQ(ask(0, "G0008-0032"), Answer(true, true, "0815"));
    object.bundle("SOPInstanceUIDs", 1)->set("NumInputImages", 1);
    EXPECT_EQ(ask(0, "G0008-0032"), Answer(true, false, "0815"));
}

TEST(TmgSeries, imagesBelongToWhoHoldsThem)
{
    Tmg::ImageSeriesHelper helper("1.2");
    helper.processImage("a", "b");
    helper.processImage("c", "d");
    const Tmg::SeriesInfo* made = helper.seriesInfo().get();
    helper.create2DImageSet();
    EXPECT_EQ(helper.seriesInfo().get(), made);
    ASSERT_EQ(helper.images().size(), 2U);
    EXPECT_EQ(helper.images()[1]->second(), "d");
    helper.seriesInfo()->images().push_back(helper.images()[0]);  // the other one is deleted by the helper
    helper.images().erase(helper.images().begin());

    KpDArray<KpString> names;
    EXPECT_FALSE(Tmg::volumeCachePrecache(names, true, false));
    Tmg::volumeCacheSetFuncPrecache([](KpDArray<KpString>& n, bool a, bool b) { return n.size() == 0 && a && !b; });
    EXPECT_TRUE(Tmg::volumeCachePrecache(names, true, false));
    Tmg::volumeCacheSetFuncPrecache(nullptr);
}

}  // namespace
