#include "Image.h"

#include "FrameValues.h"
#include "Mosaic.h"

#include <algorithm>
#include <cmath>
#include <initializer_list>

namespace {

void readPlace(const FrameValues& values, Image& image)
{
    std::array<double, 6> axes{};
    KpVec3d position(0, 0, 0);
    if (!values.reals(DCM_ImagePositionPatient, position.data(), 3) ||
        !values.reals(DCM_ImageOrientationPatient, axes.data(), 6))
        return;
    const KpVec3d row(axes[0], axes[1], axes[2]), column(axes[3], axes[4], axes[5]);
    if (row.length() == 0 && column.length() == 0)
        return;  // what some devices write for an orientation that they do not know
    if (!isPlace(position, row, column)) {
        image.problem = "its position or orientation is not one of a plane";
        return;
    }
    image.hasPlace = true;
    image.position = position;
    image.rowAxis = row;
    image.columnAxis = column;
}

bool takeSpacing(const FrameValues& values, const DcmTagKey& tag, Image& image)
{
    std::array<double, 2> spacing{};
    if (!values.reals(tag, spacing.data(), 2) || !isLength(spacing[0]) || !isLength(spacing[1]))
        return false;
    image.rowSpacing = spacing[0];
    image.columnSpacing = spacing[1];
    return true;
}

void readSpacing(const FrameValues& values, Image& image)
{
    if (!takeSpacing(values, DCM_PixelSpacing, image)) {
        const char* const what = values.has(DCM_PixelSpacing) ? "unusable" : "missing";
        const char* fallback = "1 x 1 mm";
        if (takeSpacing(values, DCM_ImagerPixelSpacing, image))
            fallback = "that at the detector";
        else if (takeSpacing(values, DCM_NominalScannedPixelSpacing, image))
            fallback = "that of the scanned film";
        image.spacingProblem = std::string(what) + ", " + fallback;
    }
    const double thickness = values.real(DCM_SliceThickness, 0), gap = values.real(DCM_SpacingBetweenSlices, 0);
    image.thickness = isLength(thickness) ? thickness : 0;
    image.sliceSpacing = isLength(std::abs(gap)) ? std::abs(gap) : 0;
}

void readFormat(const FrameValues& values, PixelFormat& format)
{
    format.samples = values.integer(DCM_SamplesPerPixel, 1);
    format.bitsAllocated = values.integer(DCM_BitsAllocated, 0);
    format.bitsStored = values.integer(DCM_BitsStored, format.bitsAllocated);
    format.highBit = values.integer(DCM_HighBit, format.bitsStored - 1);
    format.isSigned = values.integer(DCM_PixelRepresentation, 0);
    format.isPlanar = values.integer(DCM_PlanarConfiguration, 0);
    format.photometric = values.text(DCM_PhotometricInterpretation);
}

/// A value of the pixels' own type. Files also hold it with the other sign.
double storedValue(double value, const PixelFormat& format)
{
    const double range = std::ldexp(1, format.bitsAllocated);
    if (format.isSigned && value >= range / 2)
        return value - range;
    return !format.isSigned && value < 0 ? value + range : value;
}

void readPadding(const FrameValues& values, Image& image)
{
    double value = 0, limit = 0;
    if (image.format.isColour() || !values.reals(DCM_PixelPaddingValue, &value, 1))
        return;
    value = storedValue(value, image.format);
    limit = values.reals(DCM_PixelPaddingRangeLimit, &limit, 1) ? storedValue(limit, image.format) : value;
    image.padding = {std::min(value, limit), std::max(value, limit)};
}

void readScale(const FrameValues& values, Image& image)
{
    image.slope = values.real(DCM_RescaleSlope, 1);
    image.intercept = values.real(DCM_RescaleIntercept, 0);
    if (values.has(DCM_DoseGridScaling))
        image.slope = values.real(DCM_DoseGridScaling, 1);
    if (image.slope == 0)
        image.problem = "its rescale slope is 0, so that its values are lost";
    image.hasModalityTable = values.has(DCM_ModalityLUTSequence);
    image.hasWindowTable = values.has(DCM_VOILUTSequence);
    image.windowCenter = values.text(DCM_WindowCenter);
    image.windowWidth = values.text(DCM_WindowWidth);
    image.windowExplanation = values.text(DCM_WindowCenterWidthExplanation);
    image.windowFunction = values.text(DCM_VOILUTFunction);
}

std::string firstOf(const FrameValues& values, std::initializer_list<DcmTagKey> tags)
{
    for (const DcmTagKey& tag : tags) {
        if (std::string text = values.text(tag); !text.empty())
            return text;
    }
    return {};
}

/// The b-value of a vendor's private block, where the standard attribute is not written.
std::string privateText(DcmItem& data, Uint16 group, const char* creator, Uint16 offset)
{
    DcmElement* const element = findPrivate(data, group, creator, offset);
    return element ? textOf(*element) : std::string();
}

std::string bValue(const FrameValues& values)
{
    std::string text = values.text(DCM_DiffusionBValue);
    if (text.empty())
        text = privateText(values.dataSet(), 0x0019, "SIEMENS MR HEADER", 0x0c);
    if (text.empty())
        text = privateText(values.dataSet(), 0x2001, "Philips Imaging DD 001", 0x03);
    if (text.empty()) {
        text = privateText(values.dataSet(), 0x0043, "GEMS_PARM_01", 0x39);
        text.resize(std::min(text.find('\\'), text.size()));
    }
    return text;
}

std::string gradient(const FrameValues& values)
{
    const std::string text = values.text(DCM_DiffusionGradientOrientation);
    return text.empty() ? privateText(values.dataSet(), 0x0019, "SIEMENS MR HEADER", 0x0e) : text;
}

/// The dimension indices of a frame, but for those of its place, each with the name of its dimension.
std::string dimensionsOf(const FrameValues& values)
{
    std::string text;
    double index = 0;
    DcmElement* const indices = values.find(DCM_DimensionIndexValues);
    for (unsigned long i = 0; indices && realOf(*indices, i, index); ++i) {
        DcmItem* dimension = nullptr;
        if (values.dataSet().findAndGetSequenceItem(DCM_DimensionIndexSequence, dimension, static_cast<long>(i)).bad())
            break;
        DcmElement* pointer = nullptr;
        DcmTagKey tag;
        if (dimension->findAndGetElement(DCM_DimensionIndexPointer, pointer).good())
            static_cast<DcmAttributeTag*>(pointer)->getTagVal(tag);
        if (tag == DCM_InStackPositionNumber || tag == DCM_ImagePositionPatient || tag == DCM_StackID ||
            tag == DCM_ImageOrientationPatient)
            continue;
        OFString label;
        if (dimension->findAndGetOFString(DCM_DimensionDescriptionLabel, label).bad() || label.empty())
            label = DcmTag(tag).getTagName();
        text +=
            (text.empty() ? "" : ", ") + std::string(label.c_str()) + " " + std::to_string(static_cast<long>(index));
    }
    return text;
}

void readTraits(const FrameValues& values, Image& image)
{
    const auto set = [&](Trait trait, const std::string& text) { image.traits[static_cast<size_t>(trait)] = text; };
    set(Trait::TemporalPosition, firstOf(values, {DCM_TemporalPositionIndex, DCM_TemporalPositionIdentifier}));
    set(Trait::EchoNumber, values.text(DCM_EchoNumbers));
    set(Trait::EchoTime, firstOf(values, {DCM_EffectiveEchoTime, DCM_EchoTime}));
    set(Trait::InversionTime, values.text(DCM_InversionTime));
    set(Trait::BValue, bValue(values));
    set(Trait::Gradient, gradient(values));
    set(Trait::TriggerTime, firstOf(values, {DCM_NominalCardiacTriggerDelayTime, DCM_TriggerTime}));
    set(Trait::Acquisition, firstOf(values, {DCM_FrameAcquisitionNumber, DCM_AcquisitionNumber}));
    set(Trait::ImageType, firstOf(values, {DCM_FrameType, DCM_ImageType}));
    set(Trait::ContrastPhase, values.text(DCM_ContrastBolusAgentPhase));
    set(Trait::Dimensions, dimensionsOf(values));
    image.stack = values.text(DCM_StackID);
    image.segment = values.text(DCM_ReferencedSegmentNumber);
}

std::string formatProblem(const Image& image)
{
    const PixelFormat& format = image.format;
    const bool isWhole = format.bitsAllocated == 8 || format.bitsAllocated == 16 || format.bitsAllocated == 32;
    if (image.rows < 1 || image.columns < 1)
        return "it has no pixels";
    if (format.samples != 1 && format.samples != 3)
        return KpString(0, "its pixels have %d samples, not 1 or 3", format.samples).c_str();
    if (!isWhole && !(format.bitsAllocated == 1 && format.samples == 1))
        return KpString(0, "unsupported pixel type: %d bits allocated", format.bitsAllocated).c_str();
    if (format.bitsStored < 1 || format.bitsStored > format.bitsAllocated || format.highBit + 1 < format.bitsStored ||
        format.highBit >= format.bitsAllocated)
        return KpString(0, "it contradicts itself: %d bits stored up to bit %d of %d", format.bitsStored,
                        format.highBit, format.bitsAllocated)
            .c_str();
    if (format.samples == 3 && (format.bitsAllocated != 8 || format.bitsStored != 8))
        return KpString(0, "unsupported pixel type: colours of %d bits", format.bitsAllocated).c_str();
    return {};
}

/// The frames of a dose, which lie at offsets along the normal of the first.
void addOffset(const FrameValues& values, Image& image)
{
    DcmElement* const offsets = values.find(DCM_GridFrameOffsetVector);
    double offset = 0, first = 0;
    if (offsets && image.hasPlace && realOf(*offsets, image.frame, offset) && realOf(*offsets, 0, first))
        image.position += image.normal() * (first == 0 ? offset : offset - first);
}

Image describeFrame(const std::string& path, DcmDataset& data, unsigned long frame)
{
    const FrameValues values(data, frame);
    Image image;
    image.path = path;
    image.frame = frame;
    image.instanceUid = values.text(DCM_SOPInstanceUID);
    image.seriesUid = values.text(DCM_SeriesInstanceUID);
    image.seriesDescription = values.text(DCM_SeriesDescription);
    image.modality = values.text(DCM_Modality);
    image.frameUid = values.text(DCM_FrameOfReferenceUID);
    image.transferSyntax = DcmXfer(data.getOriginalXfer()).getXferName();
    image.rows = values.integer(DCM_Rows, 0);
    image.columns = values.integer(DCM_Columns, 0);
    image.number = values.integer(DCM_InstanceNumber, 0);
    readFormat(values, image.format);
    readPlace(values, image);
    readSpacing(values, image);
    readScale(values, image);
    readPadding(values, image);
    readTraits(values, image);
    addOffset(values, image);
    if (const std::string problem = formatProblem(image); !problem.empty())
        image.problem = problem;
    if (!DcmXfer(data.getOriginalXfer()).isEncapsulated() && image.format.photometric.rfind("YBR_", 0) == 0 &&
        image.format.photometric != "YBR_FULL")
        image.problem = "the colour model " + image.format.photometric + " is read from compressed pixels only";
    return image;
}

}  // namespace

const char* nameOf(Trait trait)
{
    static constexpr const char* names[] = {"temporal position", "echo number",    "echo time",    "inversion time",
                                            "b-value",           "gradient",       "trigger time", "acquisition",
                                            "image type",        "contrast phase", "dimensions"};
    return names[static_cast<size_t>(trait)];
}

std::string Image::name() const
{
    std::string text = "'" + path + "'";
    if (isMultiFrame)
        text += ", frame " + std::to_string(frame + 1);
    if (tile >= 0)
        text += ", tile " + std::to_string(tile + 1);
    return text;
}

std::vector<Image> describe(const std::string& path, DcmFileFormat& file)
{
    DcmDataset& data = *file.getDataset();
    const int frames = FrameValues(data, 0).integer(DCM_NumberOfFrames, 1);
    std::vector<Image> images;
    constexpr int mostFrames = 1 << 16;  // more are a damaged header, not an object
    for (int frame = 0; frame < std::clamp(frames, 1, frames > mostFrames ? 1 : mostFrames); ++frame) {
        images.push_back(describeFrame(path, data, static_cast<unsigned long>(frame)));
        images.back().isMultiFrame = frames > 1;
    }
    if (frames > mostFrames)
        images.front().problem = "it announces " + std::to_string(frames) + " frames";
    return images.size() == 1 ? unfolded(images.front(), data) : images;
}
