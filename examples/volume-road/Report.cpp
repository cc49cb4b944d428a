#include "Report.h"

#include "Space.h"

#include <kplib/imaging/KpSOPInstanceUtility.h>
#include <kplib/imaging/TmgImages.h>
#include <kplib/rawdata/KpRawData.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

namespace {

const struct {
    const char *tag, *name;
} safeTags[] = {
    {"G0008-0060", "modality"},         {"G0008-0070", "manufacturer"},     {"G0008-1090", "model"},
    {"G0018-0015", "body part"},        {"G0018-1030", "protocol"},         {"G0008-103E", "series description"},
    {"G0018-0050", "slice thickness"},  {"G0018-0080", "repetition time"},  {"G0018-0081", "echo time"},
    {"G0018-0087", "field strength"},   {"G0018-0060", "tube voltage"},     {"G0018-1210", "kernel"},
    {"G0018-5100", "patient position"}, {"G0028-0004", "photometric type"}, {"G0002-0010", "transfer syntax"},
};

void addSafeTags(const HxParamBundle& root, KpString& text)
{
    for (const auto& [tag, name] : safeTags) {
        const char* const value = root.findTag(tag, "");
        if (*value)
            text += KpString(0, "%-20s %s\n", name, value);
    }
}

void addVolume(Volume& volume, KpString& text)
{
    float low = 0, high = 0;
    KpRawData::getRange(volume.voxels(), static_cast<unsigned long>(volume.count()), low, high);
    const auto displayed = [&](float v) { return static_cast<double>(v) * volume.slope + volume.intercept; };
    text += KpString(0, "%-20s %ld x %ld x %ld voxels of %s\n", "size", volume.dims[0], volume.dims[1], volume.dims[2],
                     volume.type.name());
    text += KpString(0, "%-20s %.6g x %.6g x %.6g mm\n", "spacing", volume.spacing[0], volume.spacing[1],
                     volume.spacing[2]);
    text += KpString(0, "%-20s (%.4f, %.4f, %.4f) mm\n", "first voxel at", volume.origin[0], volume.origin[1],
                     volume.origin[2]);
    for (const auto& axis : volume.axes)
        text += KpString(0, "%-20s (%.6f, %.6f, %.6f)\n", "axis", axis[0], axis[1], axis[2]);
    const KpOrientationLetters letters = lettersOf(volume, toVec(volume.axes[0]), toVec(volume.axes[1]));
    text +=
        KpString(0, "%-20s %s\n", "right/top/left/bottom", letters.isValid() ? letters.join('/').c_str() : "unknown");
    text += KpString(0, "%-20s %.8g to %.8g\n", "values", displayed(low), displayed(high));
}

void addRegion(const Region& region, KpString& text)
{
    text += KpString(0, "%-20s %.6g (%s)\n", "threshold", region.threshold,
                     region.isThresholdGiven ? "given" : "by Otsu's method");
    text += KpString(0, "%-20s %.2f ml, %lu voxels, the largest of %d\n", "region", region.millilitres, region.voxels,
                     region.components);
    if (region.voxels == 0)
        return;
    const KpVec3f &c = region.center, low = region.box.min(), high = region.box.max();
    const auto mm = [](float v) { return static_cast<double>(v); };
    text += KpString(0, "%-20s (%.2f, %.2f, %.2f) mm\n", "region's centre", mm(c.x()), mm(c.y()), mm(c.z()));
    text += KpString(0, "%-20s (%.2f, %.2f, %.2f) to (%.2f, %.2f, %.2f) mm\n", "region's box", mm(low.x()), mm(low.y()),
                     mm(low.z()), mm(high.x()), mm(high.y()), mm(high.z()));
}

/// What the header recommends to look at, and the pictures that do.
void addPresets(const HxParamBundle& root, KpString& text)
{
    int number = 0;
    for (const KpWindowLevel& preset : presetsOf(root))
        text += KpString(0, "%-20s center %s, width %s %s (preset-%d.png)\n", "preset", preset.centerString().c_str(),
                         preset.widthString().c_str(), preset.explanation().c_str(), ++number);
}

/// The instances that the volume, and all that is derived from it, was made of.
void addInstances(const HxParamBundle& root, KpString& text)
{
    const HxParamBundle* const instances = root.bundle("SOPInstanceUIDs");
    KpDArray<std::string> list;
    if (!KpSOPInstanceUtility::sopUIDList(instances, list))
        return;
    text += KpString(0, "%-20s %ld, hash %s\n", "source instances", list.size(),
                     KpSOPInstanceUtility::sopUIDHash(instances).c_str());
    KpDArray<int> numbers;
    Tmg::imageNumbers3D(root, 0, static_cast<int>(list.size()) - 1, numbers);
    if (numbers.size() > 0)
        text += KpString(0, "%-20s %d to %d\n", "image numbers", numbers[0], numbers[numbers.size() - 1]);
}

}  // namespace

KpResult writeText(const KpString& text, const OutputFolder& out, const char* name)
{
    FILE* const file = std::fopen(out.pathOf(name).c_str(), "wb");
    const auto length = static_cast<unsigned long>(text.length());
    const bool isWritten = file && KpRawData::fwrite(const_cast<char*>(text.c_str()), 1, length, file) == length;
    const bool isClosed = file && std::fclose(file) == 0;
    if (!isWritten || !isClosed)
        return badInput("can't write %s: %s", name, std::strerror(errno));
    return KpResult();
}

KpResult writeHeader(const HxParamBundle& root, const OutputFolder& out)
{
    KpString text;
    root.print(text, 0, nullptr);
    return writeText(text, out, "header.txt");
}

KpResult writeReport(const HxParamBundle& root, const Series& series, Volume& volume, const Window& window,
                     const Region& region, const std::string& derivedUid, const std::vector<Stage>& stages,
                     const OutputFolder& out)
{
    KpString text;
    addSafeTags(root, text);
    text += KpString(0, "%-20s %zu (%d other files skipped)\n", "images", series.slices.size(), series.skippedFiles);
    addVolume(volume, text);
    text += KpString(0, "%-20s center %.6g, width %.6g (%s)\n", "window", window.center, window.width, window.origin);
    addPresets(root, text);
    addRegion(region, text);
    addInstances(root, text);
    if (!derivedUid.empty())
        text += KpString(0, "%-20s %s\n", "derived series", derivedUid.c_str());
    for (const std::string& warning : series.warnings)
        text += KpString(0, "%-20s %s\n", "warning", warning.c_str());
    for (const Stage& stage : stages)
        text += KpString(0, "%-20s %.3f s\n", stage.name, stage.seconds);
    return writeText(text, out, "report.txt");
}
