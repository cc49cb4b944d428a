#include "Compare.h"

#include "Hex.h"
#include "Listing.h"

#include <algorithm>

namespace {

// A line of one side of the comparison.
std::string marked(char side, const std::string& line)
{
    return std::string(1, side) + line;
}

std::string_view bytesOf(std::string_view message, const Value& value)
{
    return message.substr(value.offset, value.size);
}

void compareRest(std::string_view a, unsigned long atA, std::string_view b, unsigned long atB, Differences& out)
{
    a.remove_prefix(atA);
    b.remove_prefix(atB);
    for (unsigned long i = 0; i < std::max(a.size(), b.size()); i += bytesPerLine) {
        const std::string_view lineA = a.substr(std::min(i, a.size()), bytesPerLine);
        const std::string_view lineB = b.substr(std::min(i, b.size()), bytesPerLine);
        if (lineA == lineB)
            continue;
        out.text += lineA.empty() ? "" : marked('-', hexLine(atA + i, lineA));
        out.text += lineB.empty() ? "" : marked('+', hexLine(atB + i, lineB));
        out.json.push_back(
            {{"type", "bytes"}, {"offsets", {atA + i, atB + i}}, {"values", {hexOf(lineA), hexOf(lineB)}}});
    }
}

}  // namespace

Differences compareMessages(std::string_view a, std::string_view b, const std::vector<const ValueType*>& types)
{
    const Reading readA = readValues(a, types);
    const Reading readB = readValues(b, types);
    Differences out;
    const unsigned long common = std::min(readA.values.size(), readB.values.size());
    for (unsigned long i = 0; i < common; ++i) {
        const Value& valueA = readA.values[i];
        const Value& valueB = readB.values[i];
        if (bytesOf(a, valueA) == bytesOf(b, valueB))
            continue;
        out.text += marked('-', valueLine(valueA)) + marked('+', valueLine(valueB));
        out.json.push_back({{"type", valueA.type},
                            {"offsets", {valueA.offset, valueB.offset}},
                            {"values", {valueA.json, valueB.json}}});
    }
    const auto restOf = [common](const Reading& reading) {
        return common < reading.values.size() ? reading.values[common].offset : reading.end;
    };
    compareRest(a, restOf(readA), b, restOf(readB), out);
    return out;
}
