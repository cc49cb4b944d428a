#include <kplib/imaging/TmgText.h>

#include <kplib/foundation/KpStdStringTokenizer.h>
#include <kplib/foundation/KpStringTokenizerGeneral.h>

#include <algorithm>
#include <cctype>
#include <cstring>
#include <string_view>
#include <vector>

namespace {

std::string upperCase(const char* text)
{
    std::string upper = text;
    std::transform(upper.begin(), upper.end(), upper.begin(),
                   [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
    return upper;
}

bool hasValue(const KpString& values, const KpString& value, const char* separators)
{
    KpStringTokenizerGeneral tokens(values, separators);
    while (tokens.hasMoreTokens()) {
        if (tokens.nextToken() == value)
            return true;
    }
    return false;
}

// The separator with the last position in `values`, or the first separator if none occurs.
char separatorFor(std::string_view values, const char* separators)
{
    const size_t last = values.find_last_of(separators);
    return last == std::string_view::npos ? separators[0] : values[last];
}

void appendValue(KpString& values, const KpString& value, const char* separators)
{
    const std::string_view text(values);
    const char separator = separatorFor(text, separators);
    const bool isOpen = !text.empty() && std::string_view(separators).find(text.back()) == std::string_view::npos;
    if (isOpen && separator != '\0')
        values += separator;
    values += value.c_str();
}

}  // namespace

namespace Tmg {

// All positions in the text that the pattern may have reached are followed at once: trying one after the other takes
// exponential time for patterns of many runs.
bool match(const char* pattern, const char* text, char anyRun, char anyOne)
{
    const std::string_view rest(text ? text : "");
    std::vector<char> reached(rest.size() + 1, 0);
    reached[0] = 1;
    for (const char* p = pattern ? pattern : ""; *p != '\0'; ++p, anyRun = '*', anyOne = '?') {
        std::vector<char> next(reached.size(), 0);
        if (*p == anyRun) {
            std::fill(std::find(reached.begin(), reached.end(), 1) - reached.begin() + next.begin(), next.end(), 1);
        } else {
            for (size_t i = 0; i < rest.size(); ++i) {
                if (!reached[i])
                    continue;
                if (*p == anyOne)
                    next[i] = next[i + 1] = 1;
                else if (*p == rest[i])
                    next[i + 1] = 1;
            }
        }
        reached.swap(next);
    }
    return reached.back() != 0;
}

bool matchSet(const char* patterns, const char* texts, const char* separators)
{
    if (!patterns || !texts)
        return false;
    const std::string upperTexts = upperCase(texts);
    KpStdStringTokenizer patternTokens(upperCase(patterns), separators);
    std::string pattern, text;
    while (patternTokens.hasMoreTokens()) {
        patternTokens.nextToken(pattern);
        KpStdStringTokenizer textTokens(upperTexts, separators);
        while (textTokens.hasMoreTokens()) {
            textTokens.nextToken(text);
            if (match(pattern.c_str(), text.c_str(), '*', '?'))
                return true;
        }
    }
    return false;
}

bool addToMultiValueString(KpString& target, const KpString& additions, const char* separators)
{
    bool isAdded = false;
    KpStringTokenizerGeneral tokens(additions, separators);
    while (tokens.hasMoreTokens()) {
        const KpString value = tokens.nextToken();
        if (hasValue(target, value, separators))
            continue;
        appendValue(target, value, separators ? separators : "");
        isAdded = true;
    }
    return isAdded;
}

std::string networkToLocalPath(const std::string& path)
{
    return path;
}

}  // namespace Tmg
