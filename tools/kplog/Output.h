#pragma once

#include "Entry.h"

#include <string>
#include <string_view>

/// How lines are printed.
struct Style {
    bool isJson = false;
    bool hasColours = false;
};

/// One line of output for the entry.
std::string outputOf(const Entry& entry, std::string_view line, const Style& style);

/// Whether colours are wanted: "always", "never", or "auto" for a terminal without NO_COLOR.
bool wantsColours(const std::string& choice);
