#pragma once

#include <kplib/foundation/KpStringTokenizer.h>
#include <kplib/volume/KpBitfield.h>

/// A KpStringTokenizer with separators of the caller's choice in place of white space; quotes and backslashes work as
/// there, unless they are separators themselves.
class KPLIB_API KpStringTokenizerGeneral : public KpStringTokenizer {
public:
    /// At the first token of the text, which has to outlive the tokenizer.
    KpStringTokenizerGeneral(const KpString& text, const char* separators);
    /// The same for plain text; null counts as empty.
    KpStringTokenizerGeneral(const char* text, const char* separators);

    /// Starts again with new text and the same separators.
    using KpStringTokenizer::operator=;

    /// Separates at each byte of `separators` from now on; null and "" at none. Keeps the position
    /// in the text.
    void init(const char* separators);

    bool isSpace(char c) override { return separators_.test(static_cast<unsigned char>(c)); }

private:
    KpBitfield separators_;  // one bit a byte value
};
