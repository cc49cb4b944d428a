#include "Lines.h"

#include "../volume/Volume.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <utility>

void Lines::add(const char* name, const KpString& text, Json value)
{
    lines_.push_back({name, text.c_str(), std::move(value)});
}

std::string Lines::text() const
{
    std::string all;
    for (const Line& line : lines_)
        all += KpString(0, "%-20s %s\n", line.name.c_str(), line.text.c_str()).c_str();
    return all;
}

std::string Lines::json() const
{
    Json json = Json::object();
    for (const Line& line : lines_) {
        const auto others =
            std::count_if(lines_.begin(), lines_.end(), [&](const Line& other) { return other.name == line.name; });
        if (others > 1)
            json[line.name].push_back(line.value);
        else
            json[line.name] = line.value;
    }
    return json.dump(2, ' ', false, Json::error_handler_t::replace) + "\n";
}

KpResult writeText(const std::string& text, const OutputFolder& out, const char* name)
{
    FILE* const file = std::fopen(out.pathOf(name).c_str(), "wb");
    const bool isWritten = file && std::fwrite(text.data(), 1, text.size(), file) == text.size();
    const bool isClosed = file && std::fclose(file) == 0;
    if (!isWritten || !isClosed)
        return badInput("can't write %s: %s", name, std::strerror(errno));
    return KpResult();
}
