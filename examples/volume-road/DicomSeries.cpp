#include "DicomSeries.h"

#include "DicomTree.h"

#include <kplib/imaging/KpSOPInstanceUtility.h>
#include <kplib/imaging/TmgImages.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/threads/ProgressScope.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <algorithm>
#include <cmath>
#include <filesystem>
#include <map>
#include <system_error>

namespace fs = std::filesystem;

namespace {

std::string textOf(DcmItem& item, const DcmTagKey& tag)
{
    OFString text;
    item.findAndGetOFString(tag, text);
    return text.c_str();
}

int numberOf(DcmItem& item, const DcmTagKey& tag, int otherwise)
{
    Uint16 word = 0;
    Sint32 integer = 0;
    if (item.findAndGetUint16(tag, word).good())
        return word;
    return item.findAndGetSint32(tag, integer).good() ? static_cast<int>(integer) : otherwise;
}

bool realsOf(DcmItem& item, const DcmTagKey& tag, double* out, unsigned long n)
{
    std::array<double, 6> values{};
    for (unsigned long i = 0; i < n; ++i) {
        if (item.findAndGetFloat64(tag, values[i], i).bad() || !std::isfinite(values[i]))
            return false;
    }
    std::copy_n(values.begin(), n, out);
    return true;
}

void readPlace(DcmItem& data, SliceFile& slice)
{
    Vector position{}, row{}, column{};
    std::array<double, 6> orientation{};
    std::array<double, 2> spacing{};
    if (realsOf(data, DCM_ImagePositionPatient, position.data(), 3) &&
        realsOf(data, DCM_ImageOrientationPatient, orientation.data(), 6)) {
        std::copy_n(orientation.begin(), 3, row.begin());
        std::copy_n(orientation.begin() + 3, 3, column.begin());
        slice.hasPlace = isPlace(position, row, column);
    }
    if (slice.hasPlace) {
        slice.position = position;
        slice.rowAxis = row;
        slice.columnAxis = column;
    }
    if (realsOf(data, DCM_PixelSpacing, spacing.data(), 2) && isLength(spacing[0]) && isLength(spacing[1])) {
        slice.rowSpacing = spacing[0];
        slice.columnSpacing = spacing[1];
    }
    realsOf(data, DCM_SliceThickness, &slice.thickness, 1);
}

SliceFile describe(const std::string& path, DcmFileFormat& file)
{
    DcmDataset& data = *file.getDataset();
    SliceFile slice;
    slice.path = path;
    slice.seriesUid = textOf(data, DCM_SeriesInstanceUID);
    slice.seriesDescription = textOf(data, DCM_SeriesDescription);
    slice.instanceUid = textOf(data, DCM_SOPInstanceUID);
    slice.frameUid = textOf(data, DCM_FrameOfReferenceUID);
    const DcmXfer transfer(data.getOriginalXfer());
    slice.transferSyntax = transfer.getXferName();
    slice.isCompressed = transfer.isEncapsulated();
    slice.isColour = numberOf(data, DCM_SamplesPerPixel, 1) != 1;
    slice.isInverted = textOf(data, DCM_PhotometricInterpretation) == "MONOCHROME1";
    slice.rows = numberOf(data, DCM_Rows, 0);
    slice.columns = numberOf(data, DCM_Columns, 0);
    slice.frames = numberOf(data, DCM_NumberOfFrames, 1);
    slice.bitsAllocated = numberOf(data, DCM_BitsAllocated, 0);
    slice.bitsStored = numberOf(data, DCM_BitsStored, slice.bitsAllocated);
    slice.highBit = numberOf(data, DCM_HighBit, slice.bitsStored - 1);
    slice.isSigned = numberOf(data, DCM_PixelRepresentation, 0);
    slice.number = numberOf(data, DCM_InstanceNumber, 0);
    realsOf(data, DCM_RescaleSlope, &slice.slope, 1);
    realsOf(data, DCM_RescaleIntercept, &slice.intercept, 1);
    readPlace(data, slice);
    return slice;
}

KpResult listFiles(const char* folder, std::vector<std::string>& paths)
{
    std::error_code error;
    fs::recursive_directory_iterator entry(folder, error), end;
    for (; !error && entry != end; entry.increment(error)) {
        if (entry->is_regular_file(error))
            paths.push_back(entry->path().string());
    }
    if (error)
        return badInput("can't read the folder '%s': %s", folder, error.message().c_str());
    std::sort(paths.begin(), paths.end());
    return KpResult();
}

/// Takes the images of one series out of all that were found.
KpResult pickSeries(const char* folder, const std::string& uid, std::vector<SliceFile>& found, Series& series)
{
    std::map<std::string, std::vector<SliceFile>> byUid;
    for (SliceFile& slice : found)
        byUid[slice.seriesUid].push_back(std::move(slice));
    if (byUid.empty())
        return badInput("there are no DICOM images in '%s'", folder);
    if (uid.empty() && byUid.size() == 1) {
        series.slices = std::move(byUid.begin()->second);
        return KpResult();
    }
    if (const auto hit = byUid.find(uid); hit != byUid.end()) {
        series.slices = std::move(hit->second);
        return KpResult();
    }
    KpString list;
    for (const auto& [name, slices] : byUid)
        list += KpString(0, "%s %s (%s, %zu images)", list.isEmpty() ? "" : ";", name.c_str(),
                         slices.front().seriesDescription.c_str(), slices.size());
    if (!uid.empty())
        return badInput("'%s' holds no series %s; it holds%s", folder, uid.c_str(), list.c_str());
    return badInput("'%s' holds %zu series, choose one with --series UID:%s", folder, byUid.size(), list.c_str());
}

KpResult checkPixels(const SliceFile& slice)
{
    const char* const path = slice.path.c_str();
    if (slice.isCompressed)
        return badInput("'%s' has the unsupported transfer syntax %s", path, slice.transferSyntax.c_str());
    if (slice.isColour)
        return badInput("'%s' has an unsupported pixel type: colour, not one sample a pixel", path);
    if (slice.frames != 1)
        return badInput("'%s' holds %d frames; only single-frame images are supported", path, slice.frames);
    if (slice.bitsAllocated != 8 && slice.bitsAllocated != 16)
        return badInput("'%s' has an unsupported pixel type: %d bits allocated", path, slice.bitsAllocated);
    if (slice.bitsStored < 1 || slice.bitsStored > slice.bitsAllocated || slice.highBit + 1 < slice.bitsStored ||
        slice.highBit >= slice.bitsAllocated)
        return badInput("'%s' contradicts itself: %d bits stored up to bit %d of %d", path, slice.bitsStored,
                        slice.highBit, slice.bitsAllocated);
    if (slice.rows < 1 || slice.columns < 1)
        return badInput("'%s' has no pixels", path);
    return KpResult();
}

KpResult checkAgreement(const SliceFile& first, const SliceFile& slice)
{
    const char *const a = first.path.c_str(), *const b = slice.path.c_str();
    if (slice.rows != first.rows || slice.columns != first.columns)
        return badInput("images differ in size: '%s' has %d x %d, '%s' has %d x %d", a, first.columns, first.rows, b,
                        slice.columns, slice.rows);
    if (slice.bitsAllocated != first.bitsAllocated || slice.isSigned != first.isSigned)
        return badInput("images differ in pixel type: '%s' and '%s'", a, b);
    if (slice.hasPlace != first.hasPlace || dot(slice.rowAxis, first.rowAxis) < 0.999 ||
        dot(slice.columnAxis, first.columnAxis) < 0.999)
        return badInput("images differ in orientation: '%s' and '%s'", a, b);
    return KpResult();
}

/// Distance of neighbours along the normal: the median, with a warning for each gap that differs.
KpResult measureSpacing(Series& series, double& spacing)
{
    const std::vector<SliceFile>& slices = series.slices;
    spacing = isLength(slices.front().thickness) ? slices.front().thickness : 1;
    if (!slices.front().hasPlace)
        series.warnings.emplace_back("the images don't tell where they lie; they are sorted by their numbers");
    if (slices.size() < 2)
        return KpResult();
    std::vector<double> gaps;
    for (size_t i = 1; i < slices.size(); ++i) {
        gaps.push_back(slices[i].place() - slices[i - 1].place());
        if (gaps.back() < shortestLength)
            return badInput("'%s' and '%s' lie at the same place", slices[i - 1].path.c_str(), slices[i].path.c_str());
    }
    std::vector<double> sorted = gaps;
    std::nth_element(sorted.begin(), sorted.begin() + static_cast<long>((sorted.size() - 1) / 2), sorted.end());
    const double median = sorted[(sorted.size() - 1) / 2];
    for (size_t i = 0; i < gaps.size(); ++i) {
        const long missing = std::lround(gaps[i] / median) - 1;
        if (missing > 0)
            series.warnings.emplace_back(
                KpString(0, "%ld slice(s) missing behind '%s'", missing, slices[i].path.c_str()));
        else if (std::abs(gaps[i] - median) > 0.02 * median)
            series.warnings.emplace_back(KpString(0, "uneven spacing: %.4g mm behind '%s', %.4g mm elsewhere", gaps[i],
                                                  slices[i].path.c_str(), median));
    }
    if (slices.front().hasPlace)
        spacing = median;
    return KpResult();
}

/// The stored bits as a number: cut out, and with their sign.
template <typename Word>
void cutOut(const Word* from, long n, const SliceFile& slice, Word* to)
{
    const int unused = static_cast<int>(sizeof(Word)) * 8 - slice.bitsStored;
    const int below = slice.highBit + 1 - slice.bitsStored;
    for (long i = 0; i < n; ++i) {
        const Word bits = static_cast<Word>(static_cast<Word>(from[i] >> below) << unused);
        using Signed = std::make_signed_t<Word>;
        to[i] =
            slice.isSigned ? static_cast<Word>(static_cast<Signed>(bits) >> unused) : static_cast<Word>(bits >> unused);
    }
}

template <typename Word>
KpResult copyPixels(const SliceFile& slice, const Word* pixels, unsigned long available, void* stored)
{
    const long n = static_cast<long>(slice.rows) * slice.columns;
    if (!pixels || available < static_cast<unsigned long>(n))
        return badInput("'%s' is cut off: %lu of %ld pixels", slice.path.c_str(), available, n);
    cutOut(pixels, n, slice, static_cast<Word*>(stored));
    return KpResult();
}

KpResult readPixels(const SliceFile& slice, DcmFileFormat& file, void* stored)
{
    DcmDataset& data = *file.getDataset();
    unsigned long available = 0;
    if (slice.bitsAllocated == 8) {
        const Uint8* pixels = nullptr;
        data.findAndGetUint8Array(DCM_PixelData, pixels, &available);
        return copyPixels(slice, pixels, available, stored);
    }
    const Uint16* pixels = nullptr;
    data.findAndGetUint16Array(DCM_PixelData, pixels, &available);
    return copyPixels(slice, pixels, available, stored);
}

KpPrimType storedType(const SliceFile& slice)
{
    if (slice.bitsAllocated == 8)
        return slice.isSigned ? KpPrimType::SByte : KpPrimType::Byte;
    return slice.isSigned ? KpPrimType::Short : KpPrimType::UShort;
}

/// The type of the volume: that of the images, unless each has a scale of its own, or a type that nothing works on.
KpPrimType volumeType(const Series& series)
{
    const SliceFile& first = series.slices.front();
    const bool sameScale = std::all_of(series.slices.begin(), series.slices.end(), [&](const SliceFile& s) {
        return s.slope == first.slope && s.intercept == first.intercept;
    });
    if (!sameScale)
        return KpPrimType::Float;
    return storedType(first) == KpPrimType::SByte ? KpPrimType(KpPrimType::Short) : storedType(first);
}

/// What one image holds into its slice of the volume.
void place(const SliceFile& slice, unsigned char* stored, Volume& volume, long z)
{
    const long n = volume.sliceCount();
    KpDArray<short> widened;
    KpTypedPointer source{stored, storedType(slice)};
    if (source.type == KpPrimType::SByte) {
        widened.resize(n);
        std::copy_n(reinterpret_cast<const signed char*>(stored), n, widened.data());
        source = {widened.data(), KpPrimType::Short};
    }
    if (volume.type == KpPrimType::Float && slice.slope != 0)
        KpRawData::mapLinear(volume.slice(z), source, static_cast<unsigned long>(n), slice.intercept / slice.slope,
                             slice.slope);
    else
        KpRawData::memcpy(volume.slice(z), source, n);
}

void describeVolume(const Series& series, Volume& volume)
{
    const SliceFile& first = series.slices.front();
    volume.dims = {first.columns, first.rows, static_cast<long>(series.slices.size())};
    volume.spacing = {first.columnSpacing, first.rowSpacing, series.spacing};
    volume.origin = first.position;
    volume.axes = {first.rowAxis, first.columnAxis, first.normal()};
    volume.isPlaced = first.hasPlace;
    volume.type = volumeType(series);
    if (volume.type != KpPrimType::Float) {
        volume.slope = first.slope;
        volume.intercept = first.intercept;
    }
    volume.allocate();
}

/// What differs from image to image, in image order, and which instances the volume is made of.
void addImageLevel(const Series& series, HxParamBundle& root)
{
    root.set("ImageLevelTags", "G0020-0013,G0008-0018,G0020-0032");
    KpDArray<KpString> texts, instances;
    for (const SliceFile& s : series.slices) {
        texts.append(KpString(0, "%d,%s,%.10g\\%.10g\\%.10g", s.number, s.instanceUid.c_str(), s.position[0],
                              s.position[1], s.position[2]));
        instances.append(KpString(s.instanceUid.c_str()));
    }
    Tmg::setImageTagList(root.bundle("ImageNumberList", 1), texts);
    KpSOPInstanceUtility::setSopUIDList(root.bundle("SOPInstanceUIDs", 1), instances);
}

}  // namespace

KpResult scanSeries(const char* folder, const std::string& uid, KpProgressInterface& progress, Series& series)
{
    std::vector<std::string> paths;
    if (KpResult listed = listFiles(folder, paths); listed.isBad())
        return listed;
    std::vector<SliceFile> found;
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(paths.size()), "");
    for (const std::string& path : paths) {
        if (progress.isCanceled())
            return KpResult();
        DcmFileFormat file;
        const OFCondition status = file.loadFile(path.c_str(), EXS_Unknown, EGL_noChange, 4096);
        if (status.good() && file.getDataset()->tagExists(DCM_PixelData))
            found.push_back(describe(path, file));
        else if (status.bad() && hasDicomMark(path.c_str()))
            return badInput("'%s' is cut off or damaged: %s", path.c_str(), status.text());
        else
            ++series.skippedFiles;
        progress.nextStep();
    }
    if (KpResult picked = pickSeries(folder, uid, found, series); picked.isBad())
        return picked;
    std::stable_sort(series.slices.begin(), series.slices.end(),
                     [](const SliceFile& a, const SliceFile& b) { return a.place() < b.place(); });
    for (const SliceFile& slice : series.slices) {
        KpResult checked = checkPixels(slice);
        checked << checkAgreement(series.slices.front(), slice);
        if (checked.isBad())
            return checked;
    }
    return measureSpacing(series, series.spacing);
}

KpResult readSeries(const Series& series, KpProgressInterface& progress, Volume& volume, HxParamBundle& root)
{
    describeVolume(series, volume);
    KpDArray<unsigned char> stored;
    stored.resize(volume.sliceCount() * 2);
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(series.slices.size()), "");
    for (size_t i = 0; i < series.slices.size(); ++i) {
        if (progress.isCanceled())
            return KpResult();
        const SliceFile& slice = series.slices[i];
        DcmFileFormat file;
        KpResult read = loadDicom(slice.path.c_str(), file);
        if (read.isOk())
            read = readPixels(slice, file, stored.data());
        if (read.isBad())
            return read;
        place(slice, stored.data(), volume, static_cast<long>(i));
        getTheLogInstance().tracef(KpLogInfo, "Series", "slice %zu is image %d, '%s'", i, slice.number,
                                   slice.path.c_str());
        if (i == 0)
            fillHeader(root, file);
        progress.nextStep();
    }
    addImageLevel(series, root);
    return KpResult();
}
