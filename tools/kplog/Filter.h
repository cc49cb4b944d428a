#pragma once

#include "Entry.h"

#include <string>
#include <vector>

/// Which lines of a log are wanted.
///
/// A bound is a time of day or a date with or without one, to any digit: "14:03", "2017-03-01", "2017-03-01 14". It
/// stands for all times that begin with it, so both bounds are inclusive. Lines that have no date are compared by their
/// time; they lie in no span with dates.
struct Filter {
    KpLogLevel level = KpLogDebug;     ///< and graver ones
    std::vector<std::string> modules;  ///< all, if empty
    std::string since, until;          ///< empty for no bound

    bool takes(const Entry& entry) const;
    bool hasDates() const;
};

/// Why the text is no bound; empty if it is one.
std::string problemOfBound(const std::string& text);
