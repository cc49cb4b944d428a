// kpWildMatch against its definition written with indexes, step by step.

#include <kplib/foundation/StringUtils.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>

namespace {

bool matchByDefinition(const std::string& textWithEnd, const std::string& patternWithEnd)
{
    const char *const text = textWithEnd.c_str(), *const pattern = patternWithEnd.c_str();
    size_t t = 0, p = 0, resume = 0;
    bool star = false;
    while (pattern[p] != '\0') {
        if (text[t] == '\0')
            break;
        if (pattern[p] == '*') {
            while (pattern[p] == '*')
                ++p;
            resume = p;
            star = true;
            if (pattern[p] == '\0')
                break;
        }
        if (pattern[p] == '?' || pattern[p] == text[t])
            ++p;
        else if (!star)
            return false;
        else
            p = resume;
        ++t;
    }
    while (pattern[p] == '*')
        ++p;
    if (pattern[p] == text[t])
        return true;
    if (pattern[p] != '\0' || p == 0)
        return false;
    return pattern[p - 1] == '*' || pattern[p - 1] == '?';
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    const std::string all(reinterpret_cast<const char*>(data), size);
    const size_t bar = all.find('|');
    const std::string text = all.substr(0, bar).c_str();
    const std::string pattern = bar == std::string::npos ? "" : all.substr(bar + 1).c_str();
    if (kpWildMatch(text.c_str(), pattern.c_str()) != matchByDefinition(text, pattern))
        std::abort();
    return 0;
}
