// The tokenizer with separators of the caller's choice: nothing is read outside the text, and tokens hold no separator
// unless it was quoted or escaped.

#include "Fuzz.h"

#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpStringTokenizerGeneral.h>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    Input input(data, size);
    const std::string separators = input.line(), text = input.rest();
    const bool isPlain = text.find_first_of("\"\\") == std::string::npos;
    KpStringTokenizerGeneral tokenizer(text.c_str(), separators.c_str());
    std::size_t total = 0;
    while (tokenizer.hasMoreTokens()) {
        const KpString token = tokenizer.nextToken();
        total += static_cast<std::size_t>(token.length());
        if (isPlain)
            check(std::string(token.c_str()).find_first_of(separators.c_str()) == std::string::npos);
    }
    check(total <= text.size());
    tokenizer.init(nullptr);
    return 0;
}
