#pragma once

#include <kplib/foundation/KpString.h>

#include <string_view>

/// Splits text at white space, with quotes: `ab"c d"e` is the one token `abc de`, and a backslash outside quotes takes
/// the next character as it is. Inside quotes a backslash is an ordinary character, other than KpString::protect()
/// writes it; that is meant. The text is not copied and must outlive the tokenizer.
class KPLIB_API KpStringTokenizer {
public:
    /// At the first token of the text; null counts as empty. A KpString is read to its own length, past any NUL in it.
    KpStringTokenizer(const KpString& text) : KpStringTokenizer(std::string_view(text)) {}
    KpStringTokenizer(const char* text) : KpStringTokenizer(std::string_view(text ? text : "")) {}

    /// The same with new text.
    KpStringTokenizer& operator=(const KpString& text);
    KpStringTokenizer& operator=(const char* text);

    KpStringTokenizer(const KpStringTokenizer&) = default;
    KpStringTokenizer& operator=(const KpStringTokenizer&) = default;
    virtual ~KpStringTokenizer();

    /// Whether `c` separates tokens: here the locale's white space.
    virtual bool isSpace(char c);

    /// Goes on to the next character that is no separator.
    void skipSpace();

    /// Whether there is text left.
    bool hasMoreTokens() { return pos_ < length_; }

    /// The next token, valid until the next call; empty behind the last one.
    KpString& nextToken();

protected:
    /// For a derived class with separators of its own, which a base class under construction can't ask for: skips
    /// nothing.
    struct NoSkip {};
    KpStringTokenizer(const KpString& text, NoSkip) { retarget(text); }
    KpStringTokenizer(const char* text, NoSkip) { retarget(text ? text : ""); }

private:
    explicit KpStringTokenizer(std::string_view text);
    void retarget(std::string_view text);
    void takeQuoted();

    KpString token_;
    long pos_ = 0;
    long length_ = 0;
    const char* text_ = nullptr;
};
