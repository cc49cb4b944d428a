#include "Listing.h"

#include "Hex.h"

#include <cstdio>
#include <vector>

namespace {

constexpr unsigned long longestArray = 32;

Json shortened(const Json& json)
{
    if (!json.is_array() || json.size() <= longestArray)
        return json;
    Json head(json.begin(), json.begin() + longestArray);
    head.push_back("and " + std::to_string(json.size() - longestArray) + " more");
    return head;
}

}  // namespace

std::string oneLine(const Json& json)
{
    return json.dump(-1, ' ', false, Json::error_handler_t::replace);
}

std::string valueLine(const Value& value)
{
    char columns[128];
    std::snprintf(columns, sizeof columns, "%10lu %10lu  %-20s ", value.offset, value.size, value.type.c_str());
    const Json json = value.json.is_array() ? shortened(value.json) : value.json;
    return columns + oneLine(json) + "\n";
}

Json valueAsJson(const Value& value)
{
    return {{"offset", value.offset}, {"size", value.size}, {"type", value.type}, {"value", value.json}};
}

std::string listing(std::string_view bytes, const Reading& reading)
{
    std::string text;
    if (!reading.values.empty())
        text = "    offset       size  type                 value\n";
    for (const Value& value : reading.values)
        text += valueLine(value);
    const std::string_view left = bytes.substr(reading.end);
    if (!left.empty() && !reading.values.empty())
        text += std::to_string(left.size()) + " bytes left:\n";
    return text + hexLines(reading.end, left);
}

Json listingAsJson(std::string_view bytes, const Reading& reading)
{
    Json values = Json::array();
    for (const Value& value : reading.values)
        values.push_back(valueAsJson(value));
    Json json{{"size", bytes.size()},
              {"values", values},
              {"left", {{"offset", reading.end}, {"hex", hexOf(bytes.substr(reading.end))}}}};
    if (!reading.problem.empty())
        json["problem"] = reading.problem;
    return json;
}
