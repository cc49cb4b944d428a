#pragma once

#include "Values.h"

#include <string>
#include <string_view>

/// A value as a line of a listing, with the first elements of a long array.
std::string valueLine(const Value& value);

/// The values of a message, and as hexadecimal digits the bytes after them.
std::string listing(std::string_view bytes, const Reading& reading);

/// The same as JSON.
Json listingAsJson(std::string_view bytes, const Reading& reading);

/// A value as JSON: offset, size, type, value.
Json valueAsJson(const Value& value);

/// As one line of JSON, with bytes that are not UTF-8 replaced.
std::string oneLine(const Json& json);
