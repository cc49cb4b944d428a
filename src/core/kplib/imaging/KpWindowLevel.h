#pragma once

#include <kplib/foundation/KpExport.h>

#include <array>
#include <string>
#include <vector>

/// The window attributes of a header as they are stored: Window Center (0028,1050), Window Width
/// (0028,1051) and Window Center & Width Explanation (0028,1055), each with its values separated
/// by backslashes.
struct KpWindowLevelTagGroup {
    std::string center;       ///< text of (0028,1050)
    std::string width;        ///< text of (0028,1051)
    std::string explanation;  ///< text of (0028,1055)

    KpWindowLevelTagGroup() = default;
    /// From the three texts in the order of the fields.
    KpWindowLevelTagGroup(const std::array<std::string, 3>& texts) :
        center(texts[0]), width(texts[1]), explanation(texts[2])
    {
    }
    /// The three texts in the order of the fields.
    std::array<std::string, 3> toArray() const { return {center, width, explanation}; }
};

/// A window/level preset: centre, width and an explanation.
///
/// The numbers are stored as text, so that a preset is written as it was read. center() and
/// width() parse the text, which counts as 0 if it is not a number. Numbers are written and read
/// with the decimal point of the program's locale. No operation fails. A plain value.
class KPLIB_API KpWindowLevel {
public:
    /// Three empty texts.
    KpWindowLevel() = default;
    /// Of these texts.
    KpWindowLevel(const std::string& center, const std::string& width, const std::string& explanation = {});
    /// The numbers with six decimals.
    KpWindowLevel(float center, float width, const std::string& explanation);

    /// The centre as a number.
    float center() const;
    /// The width as a number.
    float width() const;
    /// @{
    /// A text as it was given.
    std::string centerString() const { return center_; }
    std::string widthString() const { return width_; }
    std::string explanation() const { return explanation_; }
    /// @}

    /// Replaces a text.
    void setCenter(const std::string& center) { center_ = center; }
    /// Replaces a text.
    void setWidth(const std::string& width) { width_ = width; }
    /// Replaces a text.
    void setExplanation(const std::string& explanation) { explanation_ = explanation; }
    /// With six decimals.
    void setCenter(float center);
    /// With six decimals.
    void setWidth(float width);

    /// Equal numbers, however they are written, and the same explanation. A NaN equals nothing.
    bool operator==(const KpWindowLevel& other) const;

    /// The presets of a header, in its order, without those that lack the text of centre or width.
    /// None if the numbers of widths and centres differ. Explanations may be fewer or more; each
    /// belongs to the values at its position.
    static std::vector<KpWindowLevel> createFromTags(const KpWindowLevelTagGroup& group);
    /// The inverse; empty explanations keep their place.
    static KpWindowLevelTagGroup toTags(const std::vector<KpWindowLevel>& presets);

    /// The presets of `a` and then those of `b`, where each run of equal ones leaves its first.
    /// Equal ones that are not adjacent all stay.
    static std::vector<KpWindowLevel> merge(const std::vector<KpWindowLevel>& a, const std::vector<KpWindowLevel>& b);

private:
    std::string center_;
    std::string width_;
    std::string explanation_;
};
