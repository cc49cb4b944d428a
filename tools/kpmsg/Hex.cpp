#include "Hex.h"

#include <algorithm>
#include <cstdio>

std::string hexOf(std::string_view bytes, const char* gap)
{
    std::string text;
    for (const char c : bytes) {
        char digits[4];
        std::snprintf(digits, sizeof digits, "%02x", static_cast<unsigned>(static_cast<unsigned char>(c)));
        text += (text.empty() ? "" : gap) + std::string(digits);
    }
    return text;
}

std::string hexLine(unsigned long offset, std::string_view bytes)
{
    std::string characters(bytes);
    std::replace_if(
        characters.begin(), characters.end(), [](char c) { return c < ' ' || c > '~'; }, '.');
    std::string digits = hexOf(bytes, " ");
    digits.resize(3 * bytesPerLine, ' ');
    char at[24];
    std::snprintf(at, sizeof at, "%10lu  ", offset);
    return at + digits + " |" + characters + "|\n";
}

std::string hexLines(unsigned long offset, std::string_view bytes)
{
    std::string lines;
    for (unsigned long i = 0; i < bytes.size(); i += bytesPerLine)
        lines += hexLine(offset + i, bytes.substr(i, bytesPerLine));
    return lines;
}
