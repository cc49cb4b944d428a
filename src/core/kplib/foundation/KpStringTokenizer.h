#pragma once

#include <kplib/foundation/KpString.h>

#include <string_view>

/// Splits text at white space, with quotes: `ab"c d"e` is the one token `abc de`, and a backslash
/// outside quotes takes the next character as it is. Inside quotes a backslash is an ordinary
/// character, although KpString::protect() escapes with it. Intentional: stored texts depend on
/// it. The text is not copied and must outlive the tokenizer.
class KPLIB_API KpStringTokenizer {
public:
    /// At the first token of the text; null counts as empty. A KpString is read to its own length, past any NUL in it.
    KpStringTokenizer(const KpString& text) : KpStringTokenizer(std::string_view(text)) {}
    /// The same for plain text; null counts as empty.
    KpStringTokenizer(const char* text) : KpStringTokenizer(std::string_view(text ? text : "")) {}

    /// The same with new text.
    KpStringTokenizer& operator=(const KpString& text);
    /// The same for plain text; null counts as empty.
    KpStringTokenizer& operator=(const char* text);

    /// @{
    /// At the same place in the same text.
    KpStringTokenizer(const KpStringTokenizer&) = default;
    KpStringTokenizer& operator=(const KpStringTokenizer&) = default;
    /// @}

    virtual ~KpStringTokenizer();

    /// Whether `c` separates tokens: here the locale's white space.
    virtual bool isSpace(char c);

    /// Moves to the next character that is no separator.
    void skipSpace();

    /// Whether there is text left.
    bool hasMoreTokens() { return pos_ < length_; }

    /// The next token, valid until the next call; empty after the last one.
    KpString& nextToken();

protected:
    /// Selects constructors that skip nothing, for a derived class with its own isSpace(), which
    /// the base class cannot call during construction.
    struct NoSkip {};
    /// @{
    /// At the start of the text, whatever is there.
    KpStringTokenizer(const KpString& text, NoSkip) { retarget(text); }
    KpStringTokenizer(const char* text, NoSkip) { retarget(text ? text : ""); }
    /// @}
private:
    explicit KpStringTokenizer(std::string_view text);
    void retarget(std::string_view text);
    void takeQuoted();

    KpString token_;
    long pos_ = 0;
    long length_ = 0;
    const char* text_ = nullptr;
};
