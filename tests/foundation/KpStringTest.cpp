#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpStdStringTokenizer.h>
#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpStringTokenizer.h>
#include <kplib/foundation/KpStringTokenizerGeneral.h>
#include <kplib/foundation/StringUtils.h>
#include <support/FailingMalloc.h>

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <vector>

using namespace std::string_view_literals;
using Tokens = std::vector<std::string>;

template <typename Tokenizer>
static Tokens tokensOf(Tokenizer tokenizer)
{
    Tokens tokens;
    while (tokenizer.hasMoreTokens())
        tokens.emplace_back(std::string_view(tokenizer.nextToken()));
    return tokens;
}

TEST(KpString, keepsItsCapacityRules)
{
    KpString text, added = "123456789012345", joined = added + "";  // the second fills its 16
    EXPECT_EQ((std::vector<long>{text.capacity(), KpString(text).capacity(), KpString("abcdef", 1, 3).capacity()}),
              (std::vector<long>{16, 1, 4}));
    for (const auto& [length, capacity] : {std::pair(63, 64), std::pair(64, 65), std::pair(1, 65)}) {
        text.printf("%0*d", length, 7);
        EXPECT_EQ(std::tuple(text.length(), text.capacity()), std::tuple(length, capacity));
    }
    EXPECT_EQ(KpString(0, "%d %s", 7, "b"), "7 b");
    added += 'x';
    EXPECT_EQ(added.capacity(), 24);
    joined += "x";
    EXPECT_EQ(joined.capacity(), 22) << "half of the size without its NUL";
}

TEST(KpString, takesTextFromItself)
{
    KpString text = "abc";
    for (int i = 0; i < 4; ++i)
        text += text;
    text += text.c_str() + 48;
    EXPECT_EQ(text.length(), 48);
    text = text.c_str() + 45;
    EXPECT_EQ(text + 'd' + "e", "abcde");
}

TEST(KpString, holdsMoreThanTwoGibibytes)
{
    constexpr long size = 0x80000002;
    KpString text;
    text.remax(size + 2, size);  // pages that are not written take no memory
    text[size - 1] = '\0';
    text += "ab";
    EXPECT_TRUE(text.size() == size + 2 && text.data() + size - 1 == "ab"sv);
    EXPECT_EQ(text.substr(size - 1, size), "ab");
}

TEST(KpString, comparesWithTextAndNull)
{
    const char* const null = nullptr;
    const KpString text = "abc", empty = null;
    EXPECT_EQ(std::tuple(text == KpString("abc"), text == "abc", "abc" == text), std::tuple(true, true, true));
    EXPECT_EQ(std::tuple(text != "abc", text != "abd", text != "ab"), std::tuple(false, true, true));
    EXPECT_FALSE(text != null || empty != nullptr) << "a null pointer differs from no proper string";
    EXPECT_EQ(std::tuple(text > empty, text <= "abc", "abd" > text), std::tuple(true, true, true));
    EXPECT_LT(KpString("B"), KpString("a"));
    KpString moved = text;
    const KpString target = std::move(moved);
    EXPECT_NE(moved, null);
    EXPECT_NE(moved, "");  // NOLINT(bugprone-use-after-move): a string without its NUL
    moved += 'x';
    EXPECT_EQ(moved + "y", "xy");
}

TEST(KpString, inspectsAndRewrites)
{
    EXPECT_TRUE(KpString().isAlnum());
    EXPECT_TRUE(KpString("aZ").isAlpha());
    EXPECT_TRUE(KpString("09").isDigit());
    EXPECT_FALSE(KpString("\xe4").isAlpha() || KpString("a1").isDigit() || KpString("a ").isAlnum());
    const char* const replacements[][4] = {
        {"aaa", "aa", "a", "aa"}, {"abab", "ab", "abab", "abababab"}, {"abc", "", "x", "abc"}, {"abc", "b", "", "ac"}};
    for (const auto& [text, from, to, expected] : replacements) {
        KpString replaced = text;
        replaced.replaceSubStr(from, to);
        EXPECT_EQ(replaced, expected);
    }
    KpDArray<KpString> pieces{"old"};
    for (const char* text : {"a,,b", "", "a,"}) {
        KpString(text).explode(',', pieces);
        KpString joined;
        for (const KpString& piece : pieces)
            joined = joined + ',' + piece;
        EXPECT_EQ(joined, KpString(",") + text);
    }
}

TEST(KpString, keepsItsTextWhenMemoryRunsOut)
{
    KpString text = "0123456789";
    const kplib::test::FailingMalloc failures(0);
    const char* const big = "abcdefghijklmnopqrstuvwxyz";
    EXPECT_THROW(text += big, KpMemoryException);
    EXPECT_THROW(text = big, KpMemoryException);
    EXPECT_THROW(text.replaceSubStr("0", big), KpMemoryException);
    EXPECT_TRUE(text == "0123456789");
    EXPECT_THROW(text.printf("%s", big), KpMemoryException);
    EXPECT_TRUE(text == "abcdefghij") << "undefined, but a text";
}

TEST(KpStringTokenizer, joinsQuotedRunsAndEscapesThatProtectMakes)
{
    // clang-format off
    const std::pair<std::string_view, Tokens> cases[] = {
        {"ab\"c d\"e  f", {"abc de", "f"}},
        {"a\\ b c\\", {"a b", "c"}},
        {"\"abc", {"abc"}},
        {"\"a\\\" b", {"a\\", "b"}},
        {"\"\" x", {"", "x"}},
        {" \t\n", {}},
        {" a\0b c"sv, {std::string("a\0b", 3), "c"}},
    };
    // clang-format on
    KpStringTokenizer again("a");
    for (const auto& [bytes, tokens] : cases) {
        const KpString text(bytes);
        EXPECT_EQ(tokensOf(KpStringTokenizer(text)), tokens) << text;
        EXPECT_EQ(tokensOf(again = text), tokens) << text;
    }
    for (const char* text : {"abc", "a\tb", "\"a\\b\"\\", "\\\"", ""})
        EXPECT_EQ(tokensOf(KpStringTokenizer(KpString(text).protect().c_str())), Tokens{text});
    EXPECT_EQ(KpString("abc").protect(), "abc");
    EXPECT_EQ(KpString("a\"b").protect(true), "\"a\\\"b\"");
}

TEST(KpStringTokenizerGeneral, splitsAtTheBytesOfItsSet)
{
    const std::tuple<const char*, const char*, Tokens> cases[] = {
        {",;", ";a,b;c d", {"a", "b", "c d"}},
        {"", " a \"b,c\" \\,d", {" a b,c ,d"}},
        {nullptr, "a,b", {"a,b"}},
        {",", "\"a,b\"c,,d\\,e", {"a,bc", "d,e"}},
        {"\xE9", "a\xE9z,c", {"a", "z,c"}},
        {"\"\\", "a\"b c\"d\\e", {"a", "b c", "d", "e"}},  // a separator is nothing else
    };
    for (const auto& [separators, text, tokens] : cases) {
        const KpString copy(text);
        KpStringTokenizerGeneral tokenizer(copy, separators);
        EXPECT_EQ(tokensOf(tokenizer), tokens) << text;
        EXPECT_EQ(tokensOf(KpStringTokenizerGeneral(text, separators)), tokens) << text;
        tokenizer.init(" ");
        tokenizer = "  x y";
        EXPECT_EQ(tokensOf(tokenizer), (Tokens{"x", "y"})) << "of the set before nothing is left";
    }
}

TEST(KpStdStringTokenizer, splitsAtAnyOfASet)
{
    const std::pair<const char*, const char*> cases[] = {{" a b\v", nullptr}, {",;a;,b", ",;"}, {"a b", " "}};
    for (const auto& [text, delimiters] : cases) {
        KpStdStringTokenizer tokenizer(text, delimiters);
        Tokens tokens(tokenizer.countTokens());
        for (std::string& token : tokens)
            tokenizer.nextToken(token);
        EXPECT_EQ(tokens, (Tokens{"a", "b"})) << text;
        EXPECT_FALSE(tokenizer.hasMoreTokens()) << text;
    }
}

TEST(StringUtils, convertsTheWholeTextOrNothing)
{
    const std::pair<const char*, long> cases[] = {{"0x10", 16}, {"010", 8}, {" -3", -3},
                                                  {"12 ", 7},   {"", 7},    {nullptr, 7}};
    for (const auto& [text, expected] : cases) {
        bool ok = expected == 7;
        EXPECT_EQ(StringUtils::toLong(text, 7, &ok), expected);
        EXPECT_EQ(std::tuple(ok, StringUtils::toDouble(text, 7) != 7), std::tuple(expected != 7, expected != 7))
            << text;
    }
}

TEST(kpWildMatch, matchesWithoutGoingBackInTheText)
{
    const std::tuple<const char*, const char*, bool> cases[] = {
        {"abc", "a?c", true},  {"abc", "abc*", true}, {"abc", "a?", true},    {"a", "a?", false},
        {"aab", "*ab", false}, {"abab", "*b", false}, {"", "", true},         {"", "***", true},
        {"abc", "", false},    {"ABC", "abc", false}, {"abcd", "a**d", true}, {"abc", "b*", false}};
    for (const auto& [text, pattern, matches] : cases)
        EXPECT_EQ(kpWildMatch(text, pattern), matches) << text << " ~ " << pattern;
}
