#include "Entry.h"

#include <algorithm>

namespace {

constexpr std::string_view continues = "This file continues ";

// Whether the text begins with `pattern`, in which each 0 stands for any digit.
bool beginsAs(std::string_view text, std::string_view pattern)
{
    const auto isDigit = [](char c) { return c >= '0' && c <= '9'; };
    return text.size() >= pattern.size() &&
           std::equal(pattern.begin(), pattern.end(), text.begin(),
                      [&](char wanted, char c) { return wanted == '0' ? isDigit(c) : c == wanted; });
}

// Cuts the first `size` characters off.
std::string cut(std::string_view& text, std::size_t size)
{
    std::string head(text.substr(0, size));
    text.remove_prefix(size);
    return head;
}

}  // namespace

// [DATE ]TIME: L [MODULE] TEXT, or L [MODULE] TEXT. A module has no bracket.
bool EntryReader::readHead(std::string_view line)
{
    std::string date, time;
    if (beginsAs(line, "0000-00-00 00:00:00.000: ")) {
        date = cut(line, 10);
        line.remove_prefix(1);
    }
    if (beginsAs(line, "00:00:00.000: ")) {
        time = cut(line, 12);
        line.remove_prefix(2);
    }
    if (line.size() < 4 || line.substr(1, 2) != " [")
        return false;
    bool isLetter = line[0] == ' ';
    const std::string letter(1, line[0]);
    const KpLogLevel level = isLetter ? KpLogInfo : KpLogLevelFromString(letter.c_str(), &isLetter);
    const auto end = line.find("] ");
    if (!isLetter || end == std::string_view::npos)
        return false;
    entry_.date = date;
    entry_.time = time;
    entry_.level = level;
    entry_.module = line.substr(3, end - 3);
    entry_.text = line.substr(end + 2);
    return true;
}

const Entry& EntryReader::read(std::string_view line)
{
    ++entry_.line;
    entry_.hasHead = readHead(line);
    if (!entry_.hasHead)
        entry_.text = line;
    return entry_;
}

std::string continuedFile(std::string_view firstLine)
{
    EntryReader reader("");
    const Entry& entry = reader.read(firstLine);
    return entry.hasHead && entry.text.starts_with(continues) ? entry.text.substr(continues.size()) : "";
}
