#include "Report.h"

#include "../volume/Space.h"

#include <kplib/imaging/KpSOPInstanceUtility.h>
#include <kplib/imaging/TmgImages.h>

#include <array>
#include <fstream>

namespace {

using Json = Lines::Json;

const struct {
    const char *tag, *name;
} safeTags[] = {
    {"G0008-0060", "modality"},         {"G0008-0070", "manufacturer"},     {"G0008-1090", "model"},
    {"G0018-0015", "body part"},        {"G0018-1030", "protocol"},         {"G0008-103E", "series description"},
    {"G0018-0050", "slice thickness"},  {"G0018-0080", "repetition time"},  {"G0018-0081", "echo time"},
    {"G0018-0087", "field strength"},   {"G0018-0060", "tube voltage"},     {"G0018-1210", "kernel"},
    {"G0018-5100", "patient position"}, {"G0028-0004", "photometric type"}, {"G0002-0010", "transfer syntax"},
};

void addSafeTags(const HxParamBundle& root, Lines& lines)
{
    for (const auto& [tag, name] : safeTags) {
        const char* const value = root.findTag(tag, "");
        if (*value)
            lines.add(name, value);
    }
}

void addImages(const Series& series, Lines& lines)
{
    lines.add("images", KpString(0, "%zu (%d other files skipped)", series.planes.size(), series.skippedFiles),
              {{"planes", series.planes.size()}, {"other files", series.skippedFiles}});
    if (series.volumes > 1)
        lines.add("volume", KpString(0, "%zu of %zu: %s", series.volume, series.volumes, series.label.c_str()),
                  {{"number", series.volume}, {"volumes", series.volumes}, {"label", series.label}});
}

Json jsonOf(const KpVec3d& v)
{
    return {v[0], v[1], v[2]};
}

void addPlace(const Volume& volume, Lines& lines)
{
    const KpVec3d& o = volume.origin;
    lines.add("first voxel at", KpString(0, "(%.4f, %.4f, %.4f) mm", o[0], o[1], o[2]), jsonOf(o));
    for (const KpVec3d& axis : volume.axes)
        lines.add("axis", KpString(0, "(%.6f, %.6f, %.6f)", axis[0], axis[1], axis[2]), jsonOf(axis));
    lines.add("tilt", KpString(0, "%.2f degrees", volume.tilt()), volume.tilt());
    if (!volume.heights.empty())
        lines.add("slices at", KpString(0, "uneven distances, 0 to %.6g mm", volume.heights.back()), volume.heights);
}

void addVolume(Volume& volume, Lines& lines)
{
    const std::string kind = volume.components == 3 ? "colour" : volume.type.name();
    lines.add("size",
              KpString(0, "%ld x %ld x %ld voxels of %s", volume.dims[0], volume.dims[1], volume.dims[2], kind.c_str()),
              {{"dims", volume.dims}, {"type", kind}});
    const KpVec3d& s = volume.spacing;
    const bool isKnown = volume.isScaled;
    lines.add(
        "spacing",
        KpString(0, isKnown ? "%.6g x %.6g x %.6g mm" : "%.6g x %.6g x %.6g, not all known in mm", s[0], s[1], s[2]),
        {{"values", jsonOf(s)}, {"known in plane", volume.isPlaneScaled}, {"known", isKnown}});
    if (volume.isPlaced)
        addPlace(volume, lines);
    const KpOrientationLetters letters = lettersOf(volume, KpVec3f(volume.axes[0]), KpVec3f(volume.axes[1]));
    lines.add("right/top/left/bottom", letters.isValid() ? letters.join('/').c_str() : "unknown");
    if (volume.components == 3) {
        lines.add("measured on", "the luminance of the colours");
        return;
    }
    const auto [low, high] = displayedRange(volume);
    lines.add("values", KpString(0, "%.8g to %.8g", low, high), {low, high});
    if (volume.padding.isPresent())
        lines.add("padding",
                  KpString(0, "stored values %g to %g are background", volume.padding.low, volume.padding.high),
                  {volume.padding.low, volume.padding.high});
}

void addRegion(const Region& region, const Volume& volume, Lines& lines)
{
    lines.add("threshold",
              KpString(0, "%.6g (%s)", region.threshold, region.isThresholdGiven ? "given" : "by Otsu's method"),
              region.threshold);
    Json json{{"voxels", region.voxels}, {"regions", region.components}};
    if (volume.isScaled)
        json["ml"] = region.millilitres;
    const KpString size = volume.isScaled ? KpString(0, "%.2f ml, ", region.millilitres) : KpString();
    lines.add("region", size + KpString(0, "%lu voxels, the largest of %d", region.voxels, region.components), json);
    if (region.voxels == 0 || !volume.isScaled)
        return;
    const KpVec3d c(region.center), low(region.box.min()), high(region.box.max());
    lines.add("region's centre", KpString(0, "(%.2f, %.2f, %.2f) mm", c.x(), c.y(), c.z()), jsonOf(c));
    lines.add("region's box",
              KpString(0, "(%.2f, %.2f, %.2f) to (%.2f, %.2f, %.2f) mm", low.x(), low.y(), low.z(), high.x(), high.y(),
                       high.z()),
              {jsonOf(low), jsonOf(high)});
}

/// What the header recommends to look at, and the pictures that show it.
void addWindows(const Findings& findings, Lines& lines)
{
    if (findings.volume.components == 3)
        return;
    const Window& window = findings.window;
    const std::string function = window.function == Window::Linear ? "" : std::string(", ") + nameOf(window.function);
    lines.add("window",
              KpString(0, "center %.6g, width %.6g (%s%s)", window.center, window.width, window.origin.c_str(),
                       function.c_str()),
              {{"center", window.center},
               {"width", window.width},
               {"function", nameOf(window.function)},
               {"origin", window.origin}});
    int number = 0;
    for (const KpWindowLevel& preset : findings.series.windows.presets) {
        const Window shown = findings.series.windows.of(preset);
        lines.add("preset",
                  KpString(0, "center %s, width %s %s (preset-%d.png)", preset.centerString().c_str(),
                           preset.widthString().c_str(), preset.explanation().c_str(), ++number),
                  {{"center", shown.center}, {"width", shown.width}, {"explanation", preset.explanation()}});
    }
}

/// The instances that the volume, and all that is derived from it, was made of.
void addInstances(const HxParamBundle& root, Lines& lines)
{
    const HxParamBundle* const instances = root.bundle("SOPInstanceUIDs");
    KpDArray<std::string> list;
    if (!KpSOPInstanceUtility::sopUIDList(instances, list))
        return;
    const std::string hash = KpSOPInstanceUtility::sopUIDHash(instances).c_str();
    lines.add("source instances", KpString(0, "%ld, hash %s", list.size(), hash.c_str()),
              {{"count", list.size()}, {"hash", hash}});
    KpDArray<int> numbers;
    Tmg::imageNumbers3D(root, 0, static_cast<int>(list.size()) - 1, numbers);
    if (numbers.size() > 0)
        lines.add("image numbers", KpString(0, "%d to %d", numbers[0], numbers[numbers.size() - 1]),
                  {numbers[0], numbers[numbers.size() - 1]});
}

/// The largest resident set. getrusage() would also count the process that has started this one.
long peakBytes()
{
    std::ifstream status("/proc/self/status");
    for (std::string word; status >> word;) {
        long kilobytes = 0;
        if (word == "VmHWM:" && status >> kilobytes)
            return kilobytes * 1024;
    }
    return 0;
}

}  // namespace

Report makeReport(const Findings& findings)
{
    Lines lines;
    addSafeTags(findings.root, lines);
    addImages(findings.series, lines);
    addVolume(findings.volume, lines);
    addWindows(findings, lines);
    addRegion(findings.region, findings.volume, lines);
    addInstances(findings.root, lines);
    if (!findings.derivedUid.empty())
        lines.add("derived series", findings.derivedUid.c_str());
    for (const std::string& warning : findings.series.warnings)
        lines.add("warning", warning.c_str());
    for (const Stage& stage : findings.stages)
        lines.add(stage.name, KpString(0, "%.3f s", stage.seconds), stage.seconds);
    lines.add("peak memory", memoryLine(findings.volume).substr(12).c_str(), peakBytes());
    return lines;
}

KpResult writeHeader(const HxParamBundle& root, const OutputFolder& out)
{
    KpString text;
    root.print(text, 0, nullptr);
    return writeText(text.c_str(), out, "header.txt");
}

KpResult writeReport(const Report& report, const OutputFolder& out)
{
    KpResult written = writeText(report.text(), out, "report.txt");
    written << writeText(report.json(), out, "report.json");
    return written;
}

std::string memoryLine(const Volume& volume)
{
    const auto peak = static_cast<double>(peakBytes()), voxels = static_cast<double>(volume.bytes.size());
    return KpString(0, "peak memory %.0f MB, %.1f times the volume", peak / 1e6, peak / voxels).c_str();
}
