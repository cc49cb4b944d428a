#include "DicomPut.h"

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <array>
#include <cstdlib>

void put(DcmItem& item, const DcmTag& tag, const char* text)
{
    item.putAndInsertString(tag, text);
}

namespace {

/// As many digits as the 16 characters of a decimal string have room for.
KpString decimal(double value)
{
    for (int digits = 17; digits > 1; --digits) {
        KpString text(0, "%.*g", digits, value);
        const bool isShorter = std::strtod(KpString(0, "%.*g", digits - 1, value), nullptr) == value;
        if (text.length() <= 16 && !isShorter)
            return text;
    }
    return KpString(0, "%.1g", value);
}

}  // namespace

void putReals(DcmItem& item, const DcmTag& tag, std::initializer_list<double> values)
{
    KpString text;
    for (double v : values) {
        if (!text.isEmpty())
            text += '\\';
        text += decimal(v);
    }
    put(item, tag, text);
}

void putPlace(DcmItem& data, const Volume& volume, long z)
{
    const KpVec3d &x = volume.axes[0], &y = volume.axes[1], at = volume.slicePosition(z);
    put(data, DCM_InstanceNumber, KpString(0, "%ld", z + 1));
    putReals(data, DCM_RescaleIntercept, {volume.intercept});
    putReals(data, DCM_RescaleSlope, {volume.slope});
    if (volume.isPlaced) {
        putReals(data, DCM_ImagePositionPatient, {at[0], at[1], at[2]});
        putReals(data, DCM_ImageOrientationPatient, {x[0], x[1], x[2], y[0], y[1], y[2]});
    }
    if (volume.isPlaneScaled)
        putReals(data, DCM_PixelSpacing, {volume.spacing[1], volume.spacing[0]});
    const double thickness = volume.sliceExtent(z) * volume.axes[2].dot(x.cross(y));
    if (volume.isScaled) {
        putReals(data, DCM_SliceThickness, {thickness});
        putReals(data, DCM_SpacingBetweenSlices, {thickness});
    } else {
        put(data, DCM_SliceThickness, "");
    }
}

void putPixels(DcmItem& data, Volume& volume, long z)
{
    const bool isColour = volume.components == 3;
    const Uint16 bits = isColour ? 8 : 16;
    put(data, DCM_PhotometricInterpretation, isColour ? "RGB" : "MONOCHROME2");
    data.putAndInsertUint16(DCM_SamplesPerPixel, static_cast<Uint16>(volume.components));
    if (isColour)
        data.putAndInsertUint16(DCM_PlanarConfiguration, 0);
    data.putAndInsertUint16(DCM_Rows, static_cast<Uint16>(volume.dims[1]));
    data.putAndInsertUint16(DCM_Columns, static_cast<Uint16>(volume.dims[0]));
    data.putAndInsertUint16(DCM_BitsAllocated, bits);
    data.putAndInsertUint16(DCM_BitsStored, bits);
    data.putAndInsertUint16(DCM_HighBit, static_cast<Uint16>(bits - 1));
    data.putAndInsertUint16(DCM_PixelRepresentation, volume.type == KpPrimType::Short ? 1 : 0);
    if (volume.padding.isPresent() && volume.type == KpPrimType::Short)
        data.putAndInsertSint16(DcmTag(DCM_PixelPaddingValue, EVR_SS), static_cast<Sint16>(volume.padding.low));
    else if (volume.padding.isPresent())
        data.putAndInsertUint16(DcmTag(DCM_PixelPaddingValue, EVR_US), static_cast<Uint16>(volume.padding.low));
    const void* const pixels = volume.slice(z).data;
    if (isColour)
        data.putAndInsertUint8Array(DCM_PixelData, static_cast<const Uint8*>(pixels),
                                    static_cast<unsigned long>(volume.sliceBytes()));
    else
        data.putAndInsertUint16Array(DCM_PixelData, static_cast<const Uint16*>(pixels),
                                     static_cast<unsigned long>(volume.sliceCount()));
}
