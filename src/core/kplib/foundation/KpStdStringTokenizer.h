#pragma once

#include <kplib/foundation/KpExport.h>

#include <string>

/// Splits text at any of a set of characters, without quoting; separators at the ends give no empty tokens. Works on a
/// copy of the text. One thread at a time: countTokens() keeps its result.
class KPLIB_API KpStdStringTokenizer {
public:
    /// A null `delimiters` stands for " \f\n\r\t\v".
    KpStdStringTokenizer(const std::string& text, const char* delimiters = nullptr);

    /// Number of tokens in the whole text, however many have been read; O(length) the first time.
    size_t countTokens() const;

    /// Whether there is a next token.
    bool hasMoreTokens() const { return begin_ != end_; }

    /// Sets `token` to the next token. After the last one `token` stays unchanged.
    void nextToken(std::string& token);

private:
    void advance(size_t& begin, size_t& end) const;

    std::string delimiters_;
    std::string str_;
    size_t begin_;
    size_t end_;
    mutable size_t tokenCount_ = 0;
    mutable bool tokenCountValid_ = false;
};
