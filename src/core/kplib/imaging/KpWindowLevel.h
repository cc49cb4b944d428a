#pragma once

#include <kplib/foundation/KpExport.h>

#include <array>
#include <string>
#include <vector>

/// The window attributes of a header as they stand there: Window Center (0028,1050), Window Width (0028,1051) and
/// Window Center & Width Explanation (0028,1055), each with its values separated by backslashes.
struct KpWindowLevelTagGroup {
    std::string center;
    std::string width;
    std::string explanation;

    KpWindowLevelTagGroup() = default;
    /// From the three texts in the order of the fields.
    KpWindowLevelTagGroup(const std::array<std::string, 3>& texts) :
        center(texts[0]), width(texts[1]), explanation(texts[2])
    {
    }
    std::array<std::string, 3> toArray() const { return {center, width, explanation}; }
};

/// A window/level preset: centre, width and an explanation.
///
/// The numbers are kept as text, so that a preset is written back as it was read; each question for a number parses the
/// text, and what isn't a number counts as 0. Numbers are written and read with the decimal point of the program's
/// locale. Nothing fails. A plain value.
class KPLIB_API KpWindowLevel {
public:
    /// Three empty texts.
    KpWindowLevel() = default;
    KpWindowLevel(const std::string& center, const std::string& width, const std::string& explanation = {});
    /// The numbers with six decimals.
    KpWindowLevel(float center, float width, const std::string& explanation);

    float center() const;
    float width() const;
    std::string centerString() const { return center_; }
    std::string widthString() const { return width_; }
    std::string explanation() const { return explanation_; }

    void setCenter(const std::string& center) { center_ = center; }
    void setWidth(const std::string& width) { width_ = width; }
    void setExplanation(const std::string& explanation) { explanation_ = explanation; }
    /// With six decimals.
    void setCenter(float center);
    void setWidth(float width);

    /// Equal numbers, however they are written, and the same explanation. A NaN equals nothing.
    bool operator==(const KpWindowLevel& other) const;

    /// The presets of a header, in its order, without those that lack the text of centre or width. None if there are
    /// not as many widths as centres; explanations may be too few or too many, and belong to the values at their
    /// positions.
    static std::vector<KpWindowLevel> createFromTags(const KpWindowLevelTagGroup& group);
    /// The other way; also explanations that are empty keep their place.
    static KpWindowLevelTagGroup toTags(const std::vector<KpWindowLevel>& presets);

    /// The presets of `a` and then those of `b`, where each run of equal ones leaves its first. Equal ones that don't
    /// stand side by side all stay, and that is meant.
    static std::vector<KpWindowLevel> merge(const std::vector<KpWindowLevel>& a, const std::vector<KpWindowLevel>& b);

private:
    std::string center_;
    std::string width_;
    std::string explanation_;
};
