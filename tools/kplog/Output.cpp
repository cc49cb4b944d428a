#include "Output.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <cstdlib>
#include <unistd.h>

namespace {

using Json = nlohmann::ordered_json;

const char* colourOf(KpLogLevel level)
{
    switch (level) {
    case KpLogDebug:
        return "\033[2m";
    case KpLogWarning:
        return "\033[33m";
    case KpLogError:
        return "\033[31m";
    case KpLogCritical:
        return "\033[1;31m";
    case KpLogInfo:
    case KpLogOff:
        break;
    }
    return "";
}

std::string jsonOf(const Entry& entry)
{
    const Json json{{"file", entry.file},
                    {"line", entry.line},
                    {"date", entry.date},
                    {"time", entry.time},
                    {"level", KpLogLevelToString(entry.level)},
                    {"module", entry.module},
                    {"text", entry.text},
                    {"continued", !entry.hasHead}};
    return json.dump(-1, ' ', false, Json::error_handler_t::replace) + "\n";
}

}  // namespace

std::string outputOf(const Entry& entry, std::string_view line, const Style& style)
{
    if (style.isJson)
        return jsonOf(entry);
    std::string text(line);
    if (!style.hasColours)
        return text + "\n";
    // A log may hold what peers sent: on a terminal no text of it is a command.
    std::replace_if(
        text.begin(), text.end(), [](char c) { return (c >= 0 && c < ' ' && c != '\t') || c == 127; }, '?');
    const std::string colour = colourOf(entry.level);
    return colour.empty() ? text + "\n" : colour + text + "\033[0m\n";
}

bool wantsColours(const std::string& choice)
{
    if (choice != "auto")
        return choice == "always";
    const char* const noColour = std::getenv("NO_COLOR");
    return ::isatty(STDOUT_FILENO) != 0 && !(noColour && *noColour);
}
