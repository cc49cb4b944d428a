#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec4i.h>

#include <array>
#include <compare>
#include <string>
#include <utility>

/// A version number in four parts, ordered part by part. A plain value; all zero is the null version.
class KPLIB_API KpVersion {
public:
    KpVersion() = default;
    /// Of these parts.
    constexpr KpVersion(unsigned major, unsigned minor, unsigned patch, unsigned build) :
        majorVersion_(major), minorVersion_(minor), patchLevel_(patch), buildNumber_(build)
    {
    }
    /// From one to four numbers joined by dots; what follows the fourth is ignored. Null for any other text.
    explicit KpVersion(const std::string& text);

    /// @{
    /// One part.
    constexpr unsigned majorVersion() const { return majorVersion_; }
    constexpr unsigned minorVersion() const { return minorVersion_; }
    constexpr unsigned patchLevel() const { return patchLevel_; }
    constexpr unsigned buildNumber() const { return buildNumber_; }
    /// @}

    /// Replaces one part.
    void setMajorVersion(unsigned major) { majorVersion_ = major; }
    /// As above.
    void setMinorVersion(unsigned minor) { minorVersion_ = minor; }
    /// As above.
    void setPatchLevel(unsigned patch) { patchLevel_ = patch; }
    /// As above.
    void setBuildNumber(unsigned build) { buildNumber_ = build; }
    /// Replaces all parts.
    void setValues(unsigned major, unsigned minor, unsigned patch, unsigned build)
    {
        *this = KpVersion(major, minor, patch, build);
    }
    /// As above.
    void setValues(const std::array<unsigned, 4>& values) { setValues(values[0], values[1], values[2], values[3]); }

    /// Becomes the null version.
    void makeNull() { *this = KpVersion(); }
    /// Whether all parts are 0.
    bool isNull() const { return *this == KpVersion(); }

    /// Compares part by part, the major version first.
    // NOLINTNEXTLINE(modernize-use-nullptr): the check takes the default for a 0
    friend constexpr auto operator<=>(const KpVersion& a, const KpVersion& b) = default;
    /// As above.
    friend constexpr bool operator==(const KpVersion& a, const KpVersion& b) = default;
    /// low <= this <= high
    bool isBetween(const KpVersion& low, const KpVersion& high) const { return low <= *this && *this <= high; }
    /// Whether the first two parts are equal.
    bool sameMajorMinor(const KpVersion& other) const;
    /// This object's and the other's value in the first part in which they differ; 0 and 0 if they are equal.
    std::pair<unsigned, unsigned> firstMismatchingValues(const KpVersion& other) const;

    /// "1.2.0.0": always all four.
    std::string toString() const;
    /// The four, each converted as by static_cast.
    KpVec4i asKpVec4i() const;

private:
    unsigned majorVersion_ = 0, minorVersion_ = 0, patchLevel_ = 0, buildNumber_ = 0;
};
