#pragma once

#include "../commands/OutputFolder.h"

#include <kplib/foundation/KpString.h>

#include <nlohmann/json.hpp>

#include <string>
#include <vector>

/// The lines of a report: each has a name, a text for people and an exact value for programs.
class Lines {
public:
    using Json = nlohmann::ordered_json;

    struct Line {
        std::string name, text;
        Json value;
    };

    void add(const char* name, const KpString& text, Json value);
    /// The text is the value.
    void add(const char* name, const char* text) { add(name, KpString(text), std::string(text)); }

    const std::vector<Line>& all() const { return lines_; }
    /// One line each, the texts under each other.
    std::string text() const;
    /// One object; the values of a name that occurs several times are an array.
    std::string json() const;

private:
    std::vector<Line> lines_;
};

KpResult writeText(const std::string& text, const OutputFolder& out, const char* name);
