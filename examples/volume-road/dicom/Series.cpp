#include "Series.h"

#include "DicomTree.h"
#include "Pixels.h"
#include "StoredValues.h"

#include <kplib/imaging/KpSOPInstanceUtility.h>
#include <kplib/imaging/TmgImages.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/threads/ProgressScope.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <algorithm>
#include <array>
#include <tuple>
#include <utility>

namespace {

std::string listOf(const std::vector<SeriesEntry>& series)
{
    std::string list;
    for (const SeriesEntry& entry : series)
        list += (list.empty() ? " " : "; ") + entry.uid + " (" + entry.description + ", " +
                std::to_string(entry.images) + " images)";
    return list;
}

/// The series of the choice, or a failure that lists what there is.
KpResult pickSeries(const Choice& choice, Scan& scan, SeriesEntry*& entry)
{
    const char* const folder = choice.folder.c_str();
    if (scan.series.empty() && !scan.warnings.empty())
        return badInput("there are no readable DICOM images in '%s': %s", folder, scan.warnings.front().c_str());
    if (scan.series.empty())
        return badInput("there are no DICOM images in '%s'", folder);
    if (choice.uid.empty() && scan.series.size() == 1) {
        entry = &scan.series.front();
        return KpResult();
    }
    const auto hit = std::find_if(scan.series.begin(), scan.series.end(),
                                  [&](const SeriesEntry& s) { return !choice.uid.empty() && s.uid == choice.uid; });
    if (hit != scan.series.end()) {
        entry = &*hit;
        return KpResult();
    }
    const std::string list = listOf(scan.series);
    if (!choice.uid.empty())
        return badInput("'%s' holds no series %s; it holds%s", folder, choice.uid.c_str(), list.c_str());
    return badInput("'%s' holds %zu series, choose one with --series UID:%s", folder, scan.series.size(), list.c_str());
}

/// Whether all planes say the same.
template <typename Get>
bool agree(const std::vector<Image>& planes, Get get)
{
    return std::all_of(planes.begin(), planes.end(), [&](const Image& p) { return get(p) == get(planes.front()); });
}

double median(std::vector<double> values)
{
    const auto middle = values.begin() + static_cast<long>((values.size() - 1) / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}

std::vector<KpWindowLevel> presetsOfPlane(const Image& plane, Window::Function function)
{
    return presetsOf(plane.windowCenter, plane.windowWidth, plane.windowExplanation, function);
}

/// The medians of the first window of each slice: scanners fit the window to each slice by itself.
void takeMedians(const std::vector<Image>& planes, Windows& windows)
{
    std::vector<double> centers, widths;
    for (const Image& plane : planes) {
        const auto presets = presetsOfPlane(plane, windows.function);
        if (presets.empty())
            continue;
        centers.push_back(windows.of(presets.front()).center);
        widths.push_back(windows.of(presets.front()).width);
    }
    if (centers.empty())
        return;
    const KpString center(0, "%.10g", median(centers)), width(0, "%.10g", median(widths));
    windows.presets = {KpWindowLevel(center.c_str(), width.c_str(), "")};
    windows.origin = "from the header, median of the slices";
}

void takeWindows(const std::vector<Image>& planes, Series& series)
{
    Windows& windows = series.windows;
    const Image& first = planes.front();
    windows.isInverted = first.format.photometric == "MONOCHROME1";
    if (first.windowFunction == "SIGMOID")
        windows.function = Window::Sigmoid;
    else if (first.windowFunction == "LINEAR_EXACT")
        windows.function = Window::LinearExact;
    else if (!first.windowFunction.empty() && first.windowFunction != "LINEAR")
        series.warnings.push_back("the window function " + first.windowFunction + " is unknown; LINEAR is used");
    const bool isSame = agree(planes, [](const Image& p) {
        return std::tie(p.windowCenter, p.windowWidth, p.windowExplanation, p.windowFunction);
    });
    if (isSame) {
        windows.presets = presetsOfPlane(first, windows.function);
        windows.origin = "from the header";
    } else {
        takeMedians(planes, windows);
    }
}

void warnOfTables(const std::vector<Image>& planes, Series& series)
{
    const auto has = [&](bool Image::*flag) {
        return std::any_of(planes.begin(), planes.end(), [&](const Image& p) { return p.*flag; });
    };
    if (has(&Image::hasModalityTable))
        series.warnings.emplace_back("the modality look-up table is not applied: values are stored values");
    if (has(&Image::hasWindowTable))
        series.warnings.emplace_back("the VOI look-up table is not applied: pictures use a window");
}

bool isSameScale(const std::vector<Image>& planes)
{
    return agree(planes, [](const Image& p) { return std::tie(p.slope, p.intercept); });
}

void describeVolume(const Series& series, Volume& volume)
{
    const Image& first = series.planes.front();
    const Geometry& geometry = series.geometry;
    volume.dims = {first.columns, first.rows, static_cast<long>(series.planes.size())};
    volume.components = first.format.isColour() ? 3 : 1;
    volume.spacing = geometry.spacing;
    volume.origin = geometry.origin;
    volume.axes = geometry.axes;
    volume.heights = geometry.heights;
    volume.isPlaced = geometry.isPlaced;
    volume.isPlaneScaled = geometry.isPlaneScaled;
    volume.isScaled = geometry.isScaled;
    volume.type = storedType(first.format);
    if (volume.components == 3)
        return;
    if (isSameScale(series.planes)) {
        volume.slope = first.slope;
        volume.intercept = first.intercept;
        if (agree(series.planes, [](const Image& p) { return std::pair(p.padding.low, p.padding.high); }))
            volume.padding = first.padding;
    } else {
        volume.type = KpPrimType::Float;
    }
}

/// The displayed values of a plane.
void scaleInto(KpTypedPointer stored, const Image& plane, float* to, long n)
{
    KpDArray<double> values;
    values.resize(n);
    KpRawData::memcpy({values.data(), KpPrimType::Double}, stored, n);
    for (long i = 0; i < n; ++i)
        to[i] = static_cast<float>(values[i] * plane.slope + plane.intercept);
}

/// What differs from image to image, in image order, and which instances the volume is made of.
void addImageLevel(const Series& series, HxParamBundle& root)
{
    root.set("ImageLevelTags", "G0020-0013,G0008-0018,G0020-0032");
    KpDArray<KpString> texts, instances;
    for (const Image& p : series.planes) {
        texts.append(KpString(0, "%d,%s,%.10g\\%.10g\\%.10g", p.number, p.instanceUid.c_str(), p.position[0],
                              p.position[1], p.position[2]));
        if (instances.size() == 0 || p.instanceUid != instances[instances.size() - 1].c_str())
            instances.append(KpString(p.instanceUid.c_str()));
    }
    Tmg::setImageTagList(root.bundle("ImageNumberList", 1), texts);
    KpSOPInstanceUtility::setSopUIDList(root.bundle("SOPInstanceUIDs", 1), instances);
}

KpResult readPlane(PixelReader& reader, const Image& plane, Volume& volume, long z, KpDArray<unsigned char>& scratch)
{
    if (volume.type != KpPrimType::Float)
        return reader.read(plane, volume.slice(z).data);
    const KpPrimType type = storedType(plane.format);
    scratch.resize(volume.sliceCount() * type.size());
    KpResult read = reader.read(plane, scratch.data());
    if (read.isOk())
        scaleInto({scratch.data(), type}, plane, static_cast<float*>(volume.slice(z).data), volume.sliceCount());
    return read;
}

}  // namespace

KpResult inspect(Part part, Series& series)
{
    series.label = part.label;
    const std::vector<Image>& planes = part.planes;
    for (const Image& plane : planes) {
        if (!plane.problem.empty())
            return badInput("%s cannot be read: %s", plane.name().c_str(), plane.problem.c_str());
    }
    if (KpResult measured = geometryOf(planes, series.geometry); measured.isBad())
        return measured;
    const std::vector<std::string>& found = series.geometry.warnings;
    series.warnings.insert(series.warnings.end(), found.begin(), found.end());
    if (part.isUncertain)
        series.warnings.emplace_back("the places of the series have different numbers of images, distinguished only by "
                                     "their order: this volume may mix them");
    takeWindows(planes, series);
    warnOfTables(planes, series);
    if (!isSameScale(planes) && planes.front().padding.isPresent())
        series.warnings.emplace_back("the slices have scales of their own: padding is not distinguished from values");
    series.planes = std::move(part.planes);
    return KpResult();
}

KpResult scanSeries(const Choice& choice, KpProgressInterface& progress, Series& series)
{
    Scan scan;
    if (KpResult scanned = scanFolder(choice.folder, progress, scan); scanned.isBad() || progress.isCanceled())
        return scanned;
    SeriesEntry* entry = nullptr;
    if (KpResult picked = pickSeries(choice, scan, entry); picked.isBad() || !entry)
        return picked;
    series.volumes = entry->volumes.size();
    series.skippedFiles = scan.otherFiles;
    series.warnings = scan.warnings;
    const auto number = static_cast<size_t>(std::max(choice.volume, 1));
    if (number > series.volumes)
        return badInput("the series has %zu volume(s), not %zu; see volume-road list %s", series.volumes, number,
                        choice.folder.c_str());
    series.volume = number;
    Part& part = entry->volumes[number - 1];
    if (choice.volume == 0 && series.volumes > 1)
        series.warnings.emplace_back(
            KpString(0, "the series has %zu volumes; this is the first (%s); choose with --volume", series.volumes,
                     part.label.c_str()));
    return inspect(std::move(part), series);
}

KpResult readSeries(const Series& series, KpProgressInterface& progress, Volume& volume, HxParamBundle& root)
{
    describeVolume(series, volume);
    volume.allocate();
    PixelReader reader;
    KpDArray<unsigned char> scratch;
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(series.planes.size()), "");
    for (size_t i = 0; i < series.planes.size(); ++i) {
        if (progress.isCanceled())
            return KpResult();
        const Image& plane = series.planes[i];
        if (KpResult read = readPlane(reader, plane, volume, static_cast<long>(i), scratch); read.isBad())
            return read;
        getTheLogInstance().tracef(KpLogInfo, "Series", "slice %zu is image %d, %s", i, plane.number,
                                   plane.name().c_str());
        if (i == 0)
            fillHeader(root, reader.file());
        progress.nextStep();
    }
    addImageLevel(series, root);
    return KpResult();
}
