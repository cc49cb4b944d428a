// Both tokenizers and KpString::protect: nothing is read outside the text, and what protect() writes comes back as one
// token.

#include "Fuzz.h"

#include <kplib/foundation/KpStdStringTokenizer.h>
#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpStringTokenizer.h>

namespace {

void splitAtWhiteSpace(const std::string& text)
{
    size_t total = 0;
    KpStringTokenizer tokenizer(text.c_str());
    while (tokenizer.hasMoreTokens())
        total += static_cast<size_t>(tokenizer.nextToken().length());
    check(total <= text.size());
}

void splitAtASet(const std::string& text, const std::string& delimiters)
{
    KpStdStringTokenizer tokenizer(text, delimiters.empty() ? nullptr : delimiters.c_str());
    const size_t expected = tokenizer.countTokens();
    size_t count = 0;
    for (std::string token; tokenizer.hasMoreTokens(); ++count) {
        tokenizer.nextToken(token);
        check(!token.empty());
        check(delimiters.empty() || token.find_first_of(delimiters.c_str()) == std::string::npos);
    }
    check(count == expected);
}

void protectAndReadBack(const std::string& bytes)
{
    const KpString text(bytes.c_str());
    const KpString quoted = text.protect(true), plain = text.protect(false);
    const bool needsQuotes = plain == quoted;
    const bool hasEscapes = quoted.length() != text.length() + 2;
    if (needsQuotes && hasEscapes)
        return;  // intentional: escapes inside quotes are not read back
    KpStringTokenizer tokenizer(plain);
    check(tokenizer.nextToken() == text);
    check(!tokenizer.hasMoreTokens());
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    const std::string all(reinterpret_cast<const char*>(data), size);
    const size_t bar = all.find('|');
    splitAtWhiteSpace(all.c_str());
    splitAtASet(all.substr(0, bar), bar == std::string::npos ? "" : all.substr(bar + 1));
    protectAndReadBack(all);
    KpDArray<KpString> pieces;
    KpString(all.c_str()).explode('|', pieces);
    check(pieces.size() >= 1);
    return 0;
}
