#include <kplib/imaging/KpWindowLevel.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>

namespace {

constexpr char separator = '\\';

// The text of std::to_string() before C++26, which writes the shortest one.
std::string sixDecimals(float value)
{
    char text[64];  // FLT_MAX has 39 digits before the point
    std::snprintf(text, sizeof text, "%f", static_cast<double>(value));
    return text;
}

// All parts between separators, empty ones too.
std::vector<std::string> values(const std::string& text)
{
    std::vector<std::string> pieces;
    size_t begin = 0;
    for (size_t end = 0; end != std::string::npos; begin = end + 1) {
        end = text.find(separator, begin);
        pieces.push_back(text.substr(begin, end == std::string::npos ? end : end - begin));
    }
    return pieces;
}

void addValue(std::string& text, const std::string& value, bool isFirst)
{
    if (!isFirst)
        text += separator;
    text += value;
}

bool areEqualNumbers(const std::string& a, const std::string& b)
{
    return std::atof(a.c_str()) == std::atof(b.c_str());
}

}  // namespace

KpWindowLevel::KpWindowLevel(const std::string& center, const std::string& width, const std::string& explanation) :
    center_(center), width_(width), explanation_(explanation)
{
}

KpWindowLevel::KpWindowLevel(float center, float width, const std::string& explanation) :
    KpWindowLevel(sixDecimals(center), sixDecimals(width), explanation)
{
}

float KpWindowLevel::center() const
{
    return static_cast<float>(std::strtod(center_.c_str(), nullptr));
}

float KpWindowLevel::width() const
{
    return static_cast<float>(std::strtod(width_.c_str(), nullptr));
}

void KpWindowLevel::setCenter(float center)
{
    center_ = sixDecimals(center);
}

void KpWindowLevel::setWidth(float width)
{
    width_ = sixDecimals(width);
}

bool KpWindowLevel::operator==(const KpWindowLevel& other) const
{
    return areEqualNumbers(center_, other.center_) && areEqualNumbers(width_, other.width_) &&
           explanation_ == other.explanation_;
}

std::vector<KpWindowLevel> KpWindowLevel::createFromTags(const KpWindowLevelTagGroup& group)
{
    const std::vector<std::string> centers = values(group.center);
    const std::vector<std::string> widths = values(group.width);
    const std::vector<std::string> explanations = values(group.explanation);
    std::vector<KpWindowLevel> presets;
    if (centers.size() != widths.size())
        return presets;
    for (size_t i = 0; i < centers.size(); ++i) {
        if (!centers[i].empty() && !widths[i].empty())
            presets.emplace_back(centers[i], widths[i], i < explanations.size() ? explanations[i] : std::string());
    }
    return presets;
}

KpWindowLevelTagGroup KpWindowLevel::toTags(const std::vector<KpWindowLevel>& presets)
{
    KpWindowLevelTagGroup group;
    for (const KpWindowLevel& preset : presets) {
        const bool isFirst = &preset == presets.data();
        addValue(group.center, preset.center_, isFirst);
        addValue(group.width, preset.width_, isFirst);
        addValue(group.explanation, preset.explanation_, isFirst);
    }
    return group;
}

std::vector<KpWindowLevel> KpWindowLevel::merge(const std::vector<KpWindowLevel>& a,
                                                const std::vector<KpWindowLevel>& b)
{
    std::vector<KpWindowLevel> merged(a);
    merged.insert(merged.end(), b.begin(), b.end());
    merged.erase(std::unique(merged.begin(), merged.end()), merged.end());
    return merged;
}
