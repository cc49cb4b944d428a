#include "FrameValues.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdlib>
#include <initializer_list>
#include <vector>

namespace {

/// Where the functional groups keep what a single-frame image has at its top.
struct GroupOf {
    DcmTagKey tag, sequence, inner;  // `inner`: a sequence in the first one, or undefined
};
const GroupOf groups[] = {
    {DCM_ImagePositionPatient, DCM_PlanePositionSequence, DCM_UndefinedTagKey},
    {DCM_ImageOrientationPatient, DCM_PlaneOrientationSequence, DCM_UndefinedTagKey},
    {DCM_PixelSpacing, DCM_PixelMeasuresSequence, DCM_UndefinedTagKey},
    {DCM_SliceThickness, DCM_PixelMeasuresSequence, DCM_UndefinedTagKey},
    {DCM_SpacingBetweenSlices, DCM_PixelMeasuresSequence, DCM_UndefinedTagKey},
    {DCM_RescaleSlope, DCM_PixelValueTransformationSequence, DCM_UndefinedTagKey},
    {DCM_RescaleIntercept, DCM_PixelValueTransformationSequence, DCM_UndefinedTagKey},
    {DCM_RescaleType, DCM_PixelValueTransformationSequence, DCM_UndefinedTagKey},
    {DCM_WindowCenter, DCM_FrameVOILUTSequence, DCM_UndefinedTagKey},
    {DCM_WindowWidth, DCM_FrameVOILUTSequence, DCM_UndefinedTagKey},
    {DCM_WindowCenterWidthExplanation, DCM_FrameVOILUTSequence, DCM_UndefinedTagKey},
    {DCM_VOILUTFunction, DCM_FrameVOILUTSequence, DCM_UndefinedTagKey},
    {DCM_VOILUTSequence, DCM_FrameVOILUTSequence, DCM_UndefinedTagKey},
    {DCM_StackID, DCM_FrameContentSequence, DCM_UndefinedTagKey},
    {DCM_TemporalPositionIndex, DCM_FrameContentSequence, DCM_UndefinedTagKey},
    {DCM_DimensionIndexValues, DCM_FrameContentSequence, DCM_UndefinedTagKey},
    {DCM_FrameAcquisitionNumber, DCM_FrameContentSequence, DCM_UndefinedTagKey},
    {DCM_EffectiveEchoTime, DCM_MREchoSequence, DCM_UndefinedTagKey},
    {DCM_DiffusionBValue, DCM_MRDiffusionSequence, DCM_UndefinedTagKey},
    {DCM_DiffusionGradientOrientation, DCM_MRDiffusionSequence, DCM_DiffusionGradientDirectionSequence},
    {DCM_NominalCardiacTriggerDelayTime, DCM_CardiacSynchronizationSequence, DCM_UndefinedTagKey},
    {DCM_FrameType, DCM_MRImageFrameTypeSequence, DCM_UndefinedTagKey},
    {DCM_FrameType, DCM_CTImageFrameTypeSequence, DCM_UndefinedTagKey},
    {DCM_FrameType, DCM_PETFrameTypeSequence, DCM_UndefinedTagKey},
    {DCM_ReferencedSegmentNumber, DCM_SegmentIdentificationSequence, DCM_UndefinedTagKey},
    {DCM_ContrastBolusAgentPhase, DCM_ContrastBolusUsageSequence, DCM_UndefinedTagKey},
};

DcmItem* itemOf(DcmItem& item, const DcmTagKey& sequence, unsigned long number)
{
    DcmItem* found = nullptr;
    item.findAndGetSequenceItem(sequence, found, static_cast<signed long>(number));
    return found;
}

DcmElement* elementOf(DcmItem& item, const DcmTagKey& tag)
{
    DcmElement* element = nullptr;
    item.findAndGetElement(tag, element);
    return element && (element->getLength() > 0 || element->ident() == EVR_SQ) ? element : nullptr;
}

DcmElement* elementInGroups(DcmItem* functionalGroups, const DcmTagKey& tag)
{
    for (const GroupOf& group : groups) {
        if (!functionalGroups || group.tag != tag)
            continue;
        DcmItem* item = itemOf(*functionalGroups, group.sequence, 0);
        if (item && group.inner != DCM_UndefinedTagKey)
            item = itemOf(*item, group.inner, 0);
        if (DcmElement* const element = item ? elementOf(*item, tag) : nullptr)
            return element;
    }
    return nullptr;
}

template <typename Real>
std::string shortest(Real value)
{
    char text[64];
    return {text, std::to_chars(text, text + sizeof text, value).ptr};
}

bool binaryReal(DcmElement& element, unsigned long i, std::string& text)
{
    Float64 wide = 0;
    Float32 narrow = 0;
    switch (element.ident()) {
    case EVR_FD:
    case EVR_OD:
        if (element.getFloat64(wide, i).bad())
            return false;
        text = shortest(wide);
        return true;
    case EVR_FL:
    case EVR_OF:
        if (element.getFloat32(narrow, i).bad())
            return false;
        text = shortest(narrow);
        return true;
    default:
        return false;
    }
}

}  // namespace

FrameValues::FrameValues(DcmItem& dataSet, unsigned long frame) :
    dataSet_(dataSet), own_(itemOf(dataSet, DCM_PerFrameFunctionalGroupsSequence, frame)),
    shared_(itemOf(dataSet, DCM_SharedFunctionalGroupsSequence, 0))
{
}

DcmElement* FrameValues::find(const DcmTagKey& tag) const
{
    for (DcmItem* const functionalGroups : {own_, shared_}) {
        if (DcmElement* const element = elementInGroups(functionalGroups, tag))
            return element;
    }
    return elementOf(dataSet_, tag);
}

std::string FrameValues::text(const DcmTagKey& tag) const
{
    DcmElement* const element = find(tag);
    return element ? textOf(*element) : std::string();
}

bool FrameValues::reals(const DcmTagKey& tag, double* out, unsigned long n) const
{
    DcmElement* const element = find(tag);
    std::vector<double> values(n);
    for (unsigned long i = 0; i < n; ++i) {
        if (!element || !realOf(*element, i, values[i]))
            return false;
    }
    std::copy(values.begin(), values.end(), out);
    return true;
}

double FrameValues::real(const DcmTagKey& tag, double otherwise) const
{
    reals(tag, &otherwise, 1);
    return otherwise;
}

int FrameValues::integer(const DcmTagKey& tag, int otherwise) const
{
    const double value = real(tag, otherwise);
    return std::abs(value) < 2147483648.0 ? static_cast<int>(value) : otherwise;
}

std::string textOf(DcmElement& element)
{
    std::string text, value;
    for (unsigned long i = 0; binaryReal(element, i, value); ++i)
        text += (i ? "\\" : "") + value;
    if (!text.empty())
        return text;
    OFString stored;
    element.getOFStringArray(stored);
    return {stored.c_str(), stored.length()};
}

bool realOf(DcmElement& element, unsigned long i, double& out)
{
    std::string value;
    if (!binaryReal(element, i, value)) {
        OFString stored;
        if (i >= element.getVM() || element.getOFString(stored, i).bad())
            return false;
        value.assign(stored.c_str(), stored.length());
    }
    char* end = nullptr;
    const double number = std::strtod(value.c_str(), &end);
    const bool isWhole =
        end != value.c_str() &&
        value.find_first_not_of(std::string(" \0", 2), static_cast<size_t>(end - value.c_str())) == std::string::npos;
    if (!isWhole || !std::isfinite(number))
        return false;
    out = number;
    return true;
}

DcmElement* findPrivate(DcmItem& item, Uint16 group, const char* creator, Uint16 offset)
{
    for (Uint16 block = 0x10; block <= 0xff; ++block) {
        OFString found;
        if (item.findAndGetOFString(DcmTagKey(group, block), found).good() && found == creator)
            return elementOf(item, DcmTagKey(group, static_cast<Uint16>(block << 8 | offset)));
    }
    return nullptr;
}
