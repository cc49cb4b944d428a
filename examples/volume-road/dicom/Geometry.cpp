#include "Geometry.h"

#include <algorithm>
#include <cmath>

namespace {

constexpr double rounding = 1e-3;  // mm; positions are written with so much error

/// Heights along the line from the first plane to the last.
KpResult measureLine(const std::vector<Image>& planes, Geometry& geometry)
{
    const Image &first = planes.front(), &last = planes.back();
    KpVec3d line = last.position - first.position;
    line.normalize();
    const double tolerance = 0.1 * std::min(first.rowSpacing, first.columnSpacing);
    for (const Image& plane : planes) {
        const KpVec3d offset = plane.position - first.position;
        const double height = offset.dot(line), beside = (offset - line * height).length();
        if (beside > tolerance + rounding)
            return badInput("the slices do not lie on a straight line: %s is %.3g mm beside the line from the first "
                            "to the last",
                            plane.name().c_str(), beside);
        geometry.heights.push_back(height);
    }
    geometry.axes[2] = line;
    return KpResult();
}

double medianOf(std::vector<double> values)
{
    const auto middle = values.begin() + static_cast<long>((values.size() - 1) / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}

/// One line for each gap that is a whole number of others, and one for all gaps that are not.
void warnOfGaps(const std::vector<Image>& planes, const std::vector<double>& gaps, double median, Geometry& geometry)
{
    double narrowest = median, widest = median;
    for (size_t i = 0; i < gaps.size(); ++i) {
        const double slices = gaps[i] / median;
        const long whole = std::lround(slices);
        if (whole > 1 && std::abs(slices - static_cast<double>(whole)) < 0.05) {
            geometry.warnings.emplace_back(
                KpString(0, "%ld slice(s) missing after %s", whole - 1, planes[i].name().c_str()));
        } else {
            narrowest = std::min(narrowest, gaps[i]);
            widest = std::max(widest, gaps[i]);
        }
    }
    if (widest - narrowest > 0.02 * median + rounding)
        geometry.warnings.emplace_back(KpString(
            0, "uneven spacing: gaps of %.4g to %.4g mm, %.4g mm as a rule; every slice stays at its own position",
            narrowest, widest, median));
}

void measureGaps(const std::vector<Image>& planes, Geometry& geometry)
{
    std::vector<double>& heights = geometry.heights;
    std::vector<double> gaps;
    for (size_t i = 1; i < heights.size(); ++i)
        gaps.push_back(heights[i] - heights[i - 1]);
    const double median = medianOf(gaps), mean = heights.back() / static_cast<double>(gaps.size());
    double deviation = 0;
    for (size_t i = 0; i < heights.size(); ++i)
        deviation = std::max(deviation, std::abs(heights[i] - static_cast<double>(i) * mean));
    warnOfGaps(planes, gaps, median, geometry);
    const bool isEven = deviation <= rounding;
    geometry.spacing[2] = isEven ? mean : median;
    if (isEven)
        heights.clear();
}

/// The distance of slices that cannot be measured between positions.
void assumeThickness(const Image& first, bool isSingle, Geometry& geometry)
{
    const double thickness = isSingle && first.thickness > 0 ? first.thickness : first.sliceSpacing;
    const double known = thickness > 0 ? thickness : first.thickness;
    geometry.spacing[2] = known > 0 ? known : 1;
    if (isSingle && known > 0)
        return;
    geometry.isScaled = false;
    geometry.warnings.emplace_back(
        KpString(0, "the distance of the slices is unknown; %.4g mm %s assumed, and no lengths across slices are given",
                 geometry.spacing[2], known > 0 ? "as their thickness or spacing says is" : "is"));
}

}  // namespace

KpResult geometryOf(const std::vector<Image>& planes, Geometry& geometry)
{
    const Image& first = planes.front();
    geometry.isPlaced = first.hasPlace;
    geometry.origin = first.position;
    geometry.spacing = KpVec3d(first.columnSpacing, first.rowSpacing, 1);
    geometry.axes = {first.rowAxis, first.columnAxis, first.normal()};
    if (!first.spacingProblem.empty()) {
        geometry.isScaled = geometry.isPlaneScaled = false;
        geometry.warnings.push_back("the pixel spacing of the patient is " + first.spacingProblem +
                                    " is used; no lengths in mm are given");
    }
    if (!first.hasPlace)
        geometry.warnings.emplace_back("the images do not say where they lie; they are sorted by their numbers");
    if (!first.hasPlace || planes.size() == 1) {
        assumeThickness(first, planes.size() == 1, geometry);
        return KpResult();
    }
    if (KpResult measured = measureLine(planes, geometry); measured.isBad())
        return measured;
    measureGaps(planes, geometry);
    const double tilt =
        std::acos(std::clamp(geometry.axes[2].dot(first.normal()) / first.normal().length(), -1.0, 1.0)) * 180 / M_PI;
    if (tilt > 0.05)
        geometry.warnings.emplace_back(KpString(
            0,
            "tilted: the slices are shifted against each other, by %.2f degrees from their normal; voxels keep the "
            "places of their headers, pictures are resampled",
            tilt));
    return KpResult();
}
