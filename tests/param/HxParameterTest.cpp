#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>

#include <gtest/gtest.h>

#include <climits>
#include <cstdint>

namespace {

std::string printed(const HxParameter& parameter)
{
    KpString text("old");
    parameter.print(text);
    return text.c_str();
}

}  // namespace

TEST(HxParameter, readsEachElementType)
{
    const std::uint8_t bytes[] = {0, 255};
    const std::int16_t shorts[] = {0, -32768};
    const int ints[] = {0, INT_MIN};
    const float floats[] = {0, -12.5f}, complexes[] = {0, 1, -0.7f, 9};
    const double doubles[] = {0, -1.5};
    const std::uint16_t ushorts[] = {0, 65535};
    const std::uint32_t uints[] = {0, 4294967295u};
    const std::int8_t sbytes[] = {0, -128};
    const std::tuple<int, const void*, double, double, const char*> cases[] = {
        {0, bytes, 255, 255, "0 255"},
        {1, shorts, -32768, -32768, "0 -32768"},
        {2, ints, INT_MIN, INT_MIN, "0 -2147483648"},
        {3, floats, -12, -12.5, "0 -12.5"},
        {4, doubles, -1, -1.5, "0 -1.5"},
        {5, complexes, 0, -0.7f, " "},
        {7, ushorts, 65535, 65535, "0 65535"},
        {8, uints, -1, 4294967295.0, "0 4294967295"},
        {9, sbytes, -128, -128, "0 -128"},
        {12, nullptr, 0, 0, " "}};
    for (const auto& [type, data, num, real, text] : cases) {
        SCOPED_TRACE(type);
        const HxParameter parameter("x", 2, KpPrimType(type), data), copy(parameter);
        double reals[] = {9, 9};
        parameter.getReal(reals);
        EXPECT_EQ(std::tuple(parameter.getNum(1), reals[0], reals[1], printed(copy)), std::tuple(num, 0, real, text));
    }
    EXPECT_EQ(HxParameter("x", "-12.5").getNum(7) + HxParameter("x", "-12.5").getReal(7), -24.5);
    EXPECT_EQ(HxParameter("x", 1e10).getNum(0), INT_MIN);
    EXPECT_EQ(printed(HxParameter("x", "say \"a\\\"")), "say a\\");
    const float third = 1 / 3.0f;
    EXPECT_EQ(printed(HxParameter("x", 1 / 3.0)) + printed(HxParameter("x", 1, &third)), "0.3333333333330.33333334");
    EXPECT_EQ(printed(HxParameter("x", 0, &third)), "");
}

TEST(HxParameter, countsEachSetAsAChangeButThatOfItsOwnBlock)
{
    HxParameter text("x", "abc");
    text.set(text.getString());
    EXPECT_EQ(text.touched(), 0);
    text.set(std::string("abc").c_str());
    EXPECT_EQ(text.touched(), HxParamBase::TouchValue | HxParamBase::TouchAny);
    text.set(text.getString() + 1);
    EXPECT_STREQ(text.getString(), "bc") << "from inside the old value";
    text.set(nullptr);
    EXPECT_STREQ(text.getString(), "");
    const int number = 5;
    text.set(0, &number);
    EXPECT_EQ(text.dimension(), 0);
    EXPECT_NE(text.value(), nullptr);
    EXPECT_FALSE(HxParameter("x", 0, &number).value());
}

TEST(HxParameter, isEqualOnlyInBytes)
{
    const std::uint8_t bytes[] = {1, 2}, others[] = {1, 3};
    const HxParameter parameter("x", 2, KpPrimType::Byte, bytes);
    EXPECT_FALSE(parameter.isEqual(2, KpPrimType::Byte, others) || parameter.isEqual(2, KpPrimType::Byte, nullptr));
    EXPECT_TRUE(parameter.isEqual(7, KpPrimType::String, parameter.value()));
    EXPECT_TRUE(parameter == HxParameter("x", 2, KpPrimType::Byte, bytes));
    EXPECT_FALSE(HxParameter("x", 1) == HxParameter("x", 1));
    const HxParameter odd("x", 1000, KpPrimType::String, "short");
    EXPECT_FALSE(odd.isEqual(1000, KpPrimType::Byte, std::string(1000, 's').c_str()))
        << "nothing behind the block is read";
}

TEST(HxParameter, assignmentLeavesItsMarkAboveOnly)
{
    HxParamBundle parent("parent");
    parent.set("x", "old");
    HxParameter& target = *parent.find("x", 0, 255);
    parent.untouchAll(255);
    HxParameter source("x", 2.5);
    source.setFlag(HxParamBase::FlagHidden, 1);
    target = source;
    EXPECT_EQ(parent.touched(), HxParamBase::TouchChildValue | HxParamBase::TouchAny);
    EXPECT_EQ(std::tuple(target.touched(), target.flags(), target.getReal(0)),
              std::tuple(0, HxParamBase::FlagHidden, 2.5));
    target = HxParameter("y", 1, KpPrimType::String, nullptr);
    EXPECT_EQ(target.touched(), HxParamBase::TouchName | HxParamBase::TouchAny);
}

TEST(HxParameter, keepsFourTextsOfNumbersValid)
{
    const char* texts[5];
    for (int i = 0; i < 5; ++i)
        texts[i] = HxParameter("x", i).getString();
    EXPECT_STREQ(texts[1], "1");
}

TEST(HxParameter, findsTheValueBehindADescription)
{
    for (const char* text : {"Modality: CT|CT", "a:b|", ": |", "a: b: c|b: c", "abc:|-", "abc|-", "|-"}) {
        const std::string whole(text), expected = whole.substr(whole.find('|') + 1);
        const HxParameter leaf("x", whole.substr(0, whole.find('|')).c_str());
        const char* value = "-";
        EXPECT_EQ(leaf.getBundleTagValue(value), expected != "-");
        EXPECT_EQ(value, expected) << text;
    }
}
