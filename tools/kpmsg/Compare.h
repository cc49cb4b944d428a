#pragma once

#include "Values.h"

#include <string>
#include <string_view>
#include <vector>

/// What differs between two messages.
struct Differences {
    std::string text;  ///< lines of A begin with "-", those of B with "+"
    Json json = Json::array();
    bool none() const { return json.empty(); }
};

/// Compares the bytes of the values one by one, and of the rest in lines.
Differences compareMessages(std::string_view a, std::string_view b, const std::vector<const ValueType*>& types);
