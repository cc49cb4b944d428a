// What KpFilename makes of texts: pack() against its definition written with positions, and the others for what holds
// of their results.

#include "Fuzz.h"

#include <kplib/system/KpFilename.h>

#include <algorithm>

namespace {

std::string replacedOnce(const std::string& text, const std::string& from)
{
    std::string result;
    for (size_t at = 0; at < text.size();) {
        const bool matches = text.compare(at, from.size(), from) == 0;
        result += text[at];  // each of `from` begins with the slash that stands for it
        at += matches ? from.size() : 1;
    }
    return result;
}

std::string packedByDefinition(std::string text)
{
    std::replace(text.begin(), text.end(), '\\', '/');
    text = replacedOnce(replacedOnce(text, "//"), "/./");
    for (;;) {
        size_t up = 0;
        while (up < text.size() && text.compare(up, 3, "/..") != 0)
            ++up;
        if (up == text.size())
            return text;
        size_t parent = up;
        while (parent > 0 && text[parent - 1] != '/')
            --parent;
        if (parent == 0 && up > 0)
            return text;
        text = text.substr(0, up == 0 ? 0 : parent - 1) + text.substr(up + 3);
    }
}

std::string packed(const std::string& text)
{
    KpFilename name(text.c_str());
    name.pack();
    return name.c_str();
}

void expandTwice(const std::string& text)
{
    KpFilename name(text.c_str());
    name.expandPath();
    const KpFilename once = name;
    name.expandPath();
    check(name == once && once.c_str()[0] == '/');
    name.canonizePath();
}

void splitAndJoin(const std::string& text)
{
    KpFilename name(text.c_str());
    const std::string extension = name.extension();
    name.removeExtension();
    check(name.c_str() + extension == text);
}

void relativeTo(const std::string& text, const std::string& base)
{
    KpFilename name(text.c_str()), self(text.c_str()), other(base.c_str());
    name.makeRelativeTo(other);
    self.makeRelativeTo(self);
    check(other == base.c_str());
}

void enumerate(const std::string& pattern, int number)
{
    KpString result;
    KpFilename::enumerate(result, pattern.c_str(), number);
    check(result.length() >= static_cast<int>(pattern.size()));
    check(number > 1 || pattern.find('#') != std::string::npos || result == pattern.c_str());
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    const std::string all(reinterpret_cast<const char*>(data), size);
    const size_t bar = all.find('|');
    const std::string text = all.substr(0, bar).c_str();
    const std::string second = bar == std::string::npos ? "" : all.substr(bar + 1).c_str();
    check(packed(text) == packedByDefinition(text));
    expandTwice(text);
    splitAndJoin(text);
    relativeTo(text, second);
    enumerate(text, static_cast<int>(size));
    enumerate(text, -static_cast<int>(second.size()));
    return 0;
}
