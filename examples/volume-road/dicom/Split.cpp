#include "Split.h"

#include <algorithm>
#include <compare>
#include <cstdlib>
#include <map>
#include <optional>
#include <set>
#include <tuple>
#include <utility>

namespace {

bool isNear(const KpVec3d& a, const KpVec3d& b)
{
    constexpr double tolerance = 2e-4;  // a twentieth of a millimetre at the far edge of a 256 mm field
    return (a - b).length() < tolerance;
}

bool isNear(double a, double b)
{
    return std::abs(a - b) <= 1e-4 * std::max(a, b);
}

/// Whether two planes can be slices of one volume.
bool fit(const Image& a, const Image& b)
{
    const bool samePixels = a.rows == b.rows && a.columns == b.columns &&
                            a.format.bitsAllocated == b.format.bitsAllocated &&
                            a.format.isSigned == b.format.isSigned && a.format.isColour() == b.format.isColour() &&
                            (a.format.photometric == "MONOCHROME1") == (b.format.photometric == "MONOCHROME1");
    return samePixels && a.hasPlace == b.hasPlace && a.frameUid == b.frameUid && a.stack == b.stack &&
           a.segment == b.segment && (a.tile < 0) == (b.tile < 0) && isNear(a.rowAxis, b.rowAxis) &&
           isNear(a.columnAxis, b.columnAxis) && isNear(a.rowSpacing, b.rowSpacing) &&
           isNear(a.columnSpacing, b.columnSpacing) && a.spacingProblem == b.spacingProblem;
}

std::string directionName(const Image& plane)
{
    if (!plane.hasPlace)
        return "without position";
    const KpVec3d normal = plane.normal();
    const double x = std::abs(normal.x()), y = std::abs(normal.y()), z = std::abs(normal.z());
    return z >= x && z >= y ? "axial" : x >= y ? "sagittal" : "coronal";
}

std::string nameOfGroup(const Image& plane)
{
    std::string name = std::to_string(plane.columns) + " x " + std::to_string(plane.rows) + " " + directionName(plane);
    if (!plane.stack.empty())
        name += ", stack " + plane.stack;
    if (!plane.segment.empty())
        name += ", segment " + plane.segment;
    return name;
}

std::vector<Part> groupsOf(std::vector<Image>& planes)
{
    std::vector<Part> groups;
    for (Image& plane : planes) {
        const auto group = std::find_if(groups.begin(), groups.end(),
                                        [&](const Part& part) { return fit(part.planes.front(), plane); });
        if (group == groups.end())
            groups.push_back({{std::move(plane)}, {}, false});
        else
            group->planes.push_back(std::move(plane));
    }
    for (Part& group : groups) {
        if (groups.size() > 1)
            group.label = nameOfGroup(group.planes.front());
    }
    return groups;
}

bool comesBefore(const Image& a, const Image& b)
{
    return std::tie(a.number, a.path, a.frame, a.tile) < std::tie(b.number, b.path, b.frame, b.tile);
}

/// The planes of a part by their places.
class Places {
public:
    /// Sorts the planes by place, and by number where they lie at one place.
    explicit Places(std::vector<Image>& planes)
    {
        std::sort(planes.begin(), planes.end(), [](const Image& a, const Image& b) { return a.place() < b.place(); });
        const double tolerance = toleranceOf(planes);
        for (size_t i = 0; i < planes.size(); ++i) {
            if (i == 0 || planes[i].place() - planes[i - 1].place() > tolerance)
                starts_.push_back(i);
        }
        starts_.push_back(planes.size());
        for (size_t p = 0; p < count(); ++p) {
            std::sort(planes.begin() + begin(p), planes.begin() + begin(p + 1), comesBefore);
            most_ = std::max(most_, starts_[p + 1] - starts_[p]);
        }
    }
    size_t count() const { return starts_.size() - 1; }
    size_t most() const { return most_; }  ///< planes at one place
    long begin(size_t place) const { return static_cast<long>(starts_[place]); }

private:
    /// Repetitions of a slice are written with other rounding; slices are much farther apart than that.
    static double toleranceOf(const std::vector<Image>& planes)
    {
        constexpr double rounding = 0.01;
        std::vector<double> gaps;
        for (size_t i = 1; i < planes.size(); ++i) {
            const double gap = planes[i].place() - planes[i - 1].place();
            if (gap > rounding)
                gaps.push_back(gap);
        }
        if (gaps.empty())
            return rounding / 10;
        const auto middle = gaps.begin() + static_cast<long>(gaps.size() / 2);
        std::nth_element(gaps.begin(), middle, gaps.end());
        return std::min(rounding, *middle / 20);
    }

    std::vector<size_t> starts_;
    size_t most_ = 1;
};

/// Numbers by their size, other texts by the alphabet.
bool isLess(const std::string& a, const std::string& b)
{
    char *endA = nullptr, *endB = nullptr;
    const double x = std::strtod(a.c_str(), &endA), y = std::strtod(b.c_str(), &endB);
    if (endA != a.c_str() && endB != b.c_str() && x != y)
        return x < y;
    return a < b;
}

std::string joined(const std::string& label, const std::string& more)
{
    return label.empty() ? more : label + ", " + more;
}

/// Parts that each have one value of the trait.
std::vector<Part> byValue(Part& part, Trait trait, const std::set<std::string, decltype(&isLess)>& values)
{
    std::vector<Part> parts;
    std::map<std::string, size_t> indices;
    for (const std::string& value : values) {
        indices[value] = parts.size();
        const std::string shown = value.empty() ? std::string("none") : value;
        const std::string what = trait == Trait::Dimensions ? shown : std::string(nameOf(trait)) + " " + shown;
        parts.push_back({{}, joined(part.label, what), false});
    }
    for (Image& plane : part.planes)
        parts[indices[plane.trait(trait)]].planes.push_back(std::move(plane));
    return parts;
}

/// Parts that hold the first, second, ... plane of each place, as they stand.
std::vector<Part> byRank(Part& part, const Places& places, const std::string& what)
{
    std::vector<Part> parts(places.most());
    for (size_t p = 0; p < places.count(); ++p) {
        for (long i = places.begin(p); i < places.begin(p + 1); ++i)
            parts[static_cast<size_t>(i - places.begin(p))].planes.push_back(
                std::move(part.planes[static_cast<size_t>(i)]));
    }
    for (size_t i = 0; i < parts.size(); ++i) {
        parts[i].isUncertain = part.planes.size() != places.count() * places.most();
        parts[i].label = joined(part.label, what + " " + std::to_string(i + 1) + " of " + std::to_string(parts.size()));
    }
    return parts;
}

/// Splits by a trait that differs at a place; empty if it does not, or does not distinguish the planes.
std::vector<Part> splitBy(Part& part, Trait trait, const Places& places)
{
    std::set<std::string, decltype(&isLess)> values(&isLess);
    bool differs = false, isDistinct = true;
    for (size_t p = 0; p < places.count(); ++p) {
        std::set<std::string> here;
        for (long i = places.begin(p); i < places.begin(p + 1); ++i)
            here.insert(part.planes[static_cast<size_t>(i)].trait(trait));
        values.insert(here.begin(), here.end());
        differs = differs || here.size() > 1;
        isDistinct = isDistinct && here.size() == static_cast<size_t>(places.begin(p + 1) - places.begin(p));
    }
    if (!differs)
        return {};
    if (values.size() <= places.most())
        return byValue(part, trait, values);
    // Only a single number has an order that means the same at all places.
    const bool isNumber = trait != Trait::Gradient && trait != Trait::ImageType && trait != Trait::ContrastPhase &&
                          trait != Trait::Dimensions;
    if (!isDistinct || !isNumber)
        return {};
    for (size_t p = 0; p < places.count(); ++p)
        std::sort(part.planes.begin() + places.begin(p), part.planes.begin() + places.begin(p + 1),
                  [&](const Image& a, const Image& b) { return isLess(a.trait(trait), b.trait(trait)); });
    return byRank(part, places, nameOf(trait));
}

double widest(const std::vector<double>& places)
{
    double gap = 0;
    for (size_t i = 1; i < places.size(); ++i)
        gap = std::max(gap, places[i] - places[i - 1]);
    return gap;
}

double narrowest(const std::vector<double>& places)
{
    double gap = places.back() - places.front();
    for (size_t i = 1; i < places.size(); ++i)
        gap = std::min(gap, places[i] - places[i - 1]);
    return gap;
}

/// Whether the planes, sorted by place, are several even stacks of different values that lie within each other: the
/// scanner has followed a patient who moved between them.
bool areInterleaved(const std::vector<Image>& planes, Trait trait)
{
    std::map<std::string, std::vector<double>> stacks;
    std::vector<double> all;
    for (const Image& plane : planes) {
        stacks[plane.trait(trait)].push_back(plane.place());
        all.push_back(plane.place());
    }
    if (stacks.size() < 2 || widest(all) < 1.5 * narrowest(all))
        return false;
    return std::all_of(stacks.begin(), stacks.end(), [&](const auto& stack) {
        const std::vector<double>& places = stack.second;
        const double extent = places.back() - places.front();
        return places.size() > 1 && extent > 0.5 * (all.back() - all.front()) &&
               widest(places) < 1.2 * narrowest(places);
    });
}

std::vector<Part> splitInterleaved(Part& part)
{
    for (size_t t = 0; t < static_cast<size_t>(Trait::Count); ++t) {
        const auto trait = static_cast<Trait>(t);
        if (!areInterleaved(part.planes, trait))
            continue;
        std::set<std::string, decltype(&isLess)> values(&isLess);
        for (const Image& plane : part.planes)
            values.insert(plane.trait(trait));
        return byValue(part, trait, values);
    }
    return {};
}

void splitPart(Part part, std::vector<Part>& volumes)
{
    if (!part.planes.front().hasPlace) {
        std::sort(part.planes.begin(), part.planes.end(), comesBefore);
        volumes.push_back(std::move(part));
        return;
    }
    const Places places(part.planes);
    std::vector<Part> parts;
    if (places.most() == 1) {
        parts = splitInterleaved(part);
        if (parts.empty())
            volumes.push_back(std::move(part));
        for (Part& stack : parts)
            volumes.push_back(std::move(stack));
        return;
    }
    for (size_t t = 0; t < static_cast<size_t>(Trait::Count) && parts.empty(); ++t)
        parts = splitBy(part, static_cast<Trait>(t), places);
    if (parts.empty())
        parts = byRank(part, places, "number");
    for (Part& smaller : parts)
        splitPart(std::move(smaller), volumes);
}

}  // namespace

std::vector<Part> splitIntoVolumes(std::vector<Image> planes)
{
    std::sort(planes.begin(), planes.end(), comesBefore);
    std::vector<Part> volumes;
    for (Part& group : groupsOf(planes))
        splitPart(std::move(group), volumes);
    return volumes;
}
