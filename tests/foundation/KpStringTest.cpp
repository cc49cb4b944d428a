#include <kplib/foundation/KpException.h>
#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpStdStringTokenizer.h>
#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpStringTokenizer.h>
#include <kplib/foundation/StringUtils.h>
#include <support/FailingMalloc.h>

#include <gtest/gtest.h>

#include <cmath>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

namespace {

using Tokens = std::vector<std::string>;

Tokens tokensOf(const char* text)
{
    Tokens tokens;
    for (KpStringTokenizer tokenizer(text); tokenizer.hasMoreTokens();)
        tokens.emplace_back(tokenizer.nextToken());
    return tokens;
}

Tokens stdTokensOf(const char* text, const char* delimiters)
{
    KpStdStringTokenizer tokenizer(text, delimiters);
    Tokens tokens;
    while (tokenizer.hasMoreTokens())
        tokenizer.nextToken(tokens.emplace_back());
    EXPECT_EQ(tokenizer.countTokens(), tokens.size());
    return tokens;
}

}  // namespace

TEST(KpString, keepsItsCapacityRules)
{
    const KpString empty;
    EXPECT_TRUE(empty.size() == 1 && empty.capacity() == 16 && KpString(empty).capacity() == 1);
    EXPECT_EQ(KpString("abcdef", 1, 3).capacity(), 4);
    KpString text;
    for (const auto& [length, capacity] : {std::pair(63, 64), std::pair(100, 101), std::pair(1, 101)}) {
        text.printf("%0*d", length, 7);
        EXPECT_TRUE(text.length() == length && text.capacity() == capacity) << length;
    }
    KpString appended = "123456789012345", joined = appended + "";  // the first fills the 16
    appended += 'x';
    EXPECT_EQ(appended.capacity(), 24);
    joined += "x";
    EXPECT_EQ(joined.capacity(), 22);  // half of the size without its NUL
}

TEST(KpString, takesTextFromItself)
{
    KpString text = "abc";
    for (int i = 0; i < 4; ++i)
        text += text;
    EXPECT_EQ(text.length(), 48);
    EXPECT_EQ(text.substr(45, 47), "abc");
    text += text.c_str() + 48;
    EXPECT_EQ(text.length(), 48);
    text = text.c_str() + 45;
    EXPECT_EQ(text, "abc");
    text = static_cast<const char*>(nullptr);
    EXPECT_EQ(text, "");
}

TEST(KpString, comparesWithTextAndNull)
{
    const char* const null = nullptr;
    const KpString text = "abc", empty;
    EXPECT_TRUE(text == KpString("abc") && text == "abc" && "abc" == text && text != "abd" && text != "ab");
    EXPECT_FALSE(text != null || empty != nullptr);  // a null pointer differs from no proper string
    EXPECT_TRUE(text > empty && text <= "abc" && "abd" > text && KpString("B") < KpString("a"));
    KpString moved = text;
    const KpString target = std::move(moved);
    EXPECT_TRUE(moved != null && moved != "");  // NOLINT(bugprone-use-after-move): a string without its NUL
    EXPECT_STREQ(moved, "");
    moved += 'x';
    moved += "y";
    EXPECT_EQ(moved, "xy");
}

TEST(KpString, convertsNumbers)
{
    bool ok = false;
    EXPECT_TRUE(KpString("-12x").toInt(ok) == -12 && ok);
    EXPECT_TRUE(KpString("x").toInt(ok) == 0 && !ok);
    EXPECT_TRUE(KpString(" 1.5e2").toFloat(ok) == 150.0f && ok);
    EXPECT_EQ(KpString::fromInt64(-9223372036854775807LL - 1), "-9223372036854775808");
    EXPECT_TRUE(KpString("9000000000").toInt64() == 9000000000 && KpString().toInt64() == 0);
}

TEST(KpString, inspectsAndRewrites)
{
    EXPECT_TRUE(KpString().isAlnum() && KpString("aZ").isAlpha() && KpString("09").isDigit());
    EXPECT_FALSE(KpString("\xe4").isAlpha() || KpString("a1").isDigit() || KpString("a ").isAlnum());
    EXPECT_EQ(KpString("abc").substr(2, 1), "");
    EXPECT_EQ(KpString("abc").substr(2, 2), "c");
    const char* const replacements[][4] = {
        {"aaa", "aa", "a", "aa"}, {"abab", "ab", "abab", "abababab"}, {"abc", "", "x", "abc"}, {"abc", "b", "", "ac"}};
    for (const auto& [text, from, to, expected] : replacements) {
        KpString replaced = text;
        replaced.replaceSubStr(from, to);
        EXPECT_EQ(replaced, expected);
    }
}

TEST(KpString, explodesAtEachSeparator)
{
    KpDArray<KpString> pieces{"old"};
    for (const char* text : {"a,,b", ",", "", "a,"}) {
        KpString(text).explode(',', pieces);
        std::ostringstream joined;
        for (const KpString& piece : pieces)
            joined << ',' << piece;
        EXPECT_EQ(joined.str(), ',' + std::string(text));
    }
}

TEST(KpString, protectsWhatTheTokenizerSplits)
{
    EXPECT_EQ(KpString("abc").protect(), "abc");
    EXPECT_EQ(KpString("abc").protect(true), "\"abc\"");
    EXPECT_EQ(KpString("a b").protect(), "\"a b\"");
    EXPECT_EQ(KpString().protect(), "\"\"");
    EXPECT_EQ(KpString("a\"b").protect(), "a\\\"b");
    for (const char* text : {"a\tb", "\"a\\b\"\\", "\\\"", ""})
        EXPECT_EQ(tokensOf(KpString(text).protect()), Tokens{text});
}

TEST(KpStringTokenizer, joinsQuotedRunsAndEscapes)
{
    EXPECT_EQ(tokensOf("ab\"c d\"e  f"), (Tokens{"abc de", "f"}));
    EXPECT_EQ(tokensOf("a\\ b c\\"), (Tokens{"a b", "c"}));
    EXPECT_EQ(tokensOf("\"abc"), Tokens{"abc"});
    EXPECT_EQ(tokensOf("\"a\\\" b"), (Tokens{"a\\", "b"}));
    EXPECT_EQ(tokensOf("\"\" x"), (Tokens{"", "x"}));
    EXPECT_EQ(tokensOf(" \t\n"), Tokens{});
    KpStringTokenizer tokenizer("a");
    const KpString text = "  b c";
    tokenizer = text;
    EXPECT_EQ(tokenizer.nextToken(), "b");
    EXPECT_TRUE(tokenizer.hasMoreTokens());
}

TEST(KpStdStringTokenizer, splitsAtAnyOfASet)
{
    EXPECT_EQ(stdTokensOf(" a b\v", nullptr), (Tokens{"a", "b"}));
    EXPECT_EQ(stdTokensOf(",;a;,b", ",;"), (Tokens{"a", "b"}));
    EXPECT_EQ(stdTokensOf("", ","), Tokens{});
    EXPECT_EQ(stdTokensOf(",", ","), Tokens{});
    KpStdStringTokenizer tokenizer("a", ",");
    std::string token;
    tokenizer.nextToken(token);
    tokenizer.nextToken(token);
    EXPECT_EQ(token, "a");
}

TEST(StringUtils, convertsTheWholeTextOrNothing)
{
    struct {
        const char* text;
        long expected;
        bool ok;
    } const cases[] = {{"0x10", 16, true}, {"010", 8, true}, {" -3", -3, true},  {"12 ", 7, false},
                       {"", 7, false},     {"x", 7, false},  {nullptr, 7, false}};
    for (const auto& c : cases) {
        bool ok = !c.ok;
        EXPECT_EQ(StringUtils::toLong(c.text, 7, &ok), c.expected);
        EXPECT_EQ(ok, c.ok);
        EXPECT_EQ(StringUtils::toULong(c.text, 7), static_cast<unsigned long>(c.expected));
        EXPECT_EQ(std::isnan(StringUtils::toDouble(c.text, NAN)), !c.ok);
    }
}

TEST(kpWildMatch, matchesWithoutGoingBackInTheText)
{
    struct {
        const char *text, *pattern;
        bool matches;
    } const cases[] = {{"abc", "a*", true},   {"abc", "*c", true},   {"abc", "a?c", true},   {"abc", "abc*", true},
                       {"abc", "a?", true},   {"ab", "?", true},     {"a", "a?", false},     {"aab", "*ab", false},
                       {"abab", "*b", false}, {"", "", true},        {"", "***", true},      {"", "a", false},
                       {"abc", "", false},    {"ABC", "abc", false}, {"abcd", "a**d", true}, {"abc", "abd", false},
                       {"a*c", "a*c", true},  {"abc", "b*", false}};
    for (const auto& c : cases)
        EXPECT_EQ(kpWildMatch(c.text, c.pattern), c.matches) << c.text << " ~ " << c.pattern;
}

TEST(KpException, keepsAndRaisesItsText)
{
    KpException empty, formatted("n=%d", 3), copied(KpString("100%"));
    EXPECT_STREQ(empty.what(), "");
    EXPECT_STREQ(formatted.what(), "n=3");
    const std::unique_ptr<KpException> clone(copied.doClone());
    try {
        clone->doRaise();
    } catch (const KpException& e) {
        EXPECT_STREQ(e.what(), "100%");
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
