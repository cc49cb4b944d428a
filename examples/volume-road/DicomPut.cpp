#include "DicomPut.h"

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

void put(DcmItem& item, const DcmTag& tag, const char* text)
{
    item.putAndInsertString(tag, text);
}

void putReals(DcmItem& item, const DcmTag& tag, std::initializer_list<double> values)
{
    KpString text;
    for (double v : values) {
        if (!text.isEmpty())
            text += '\\';
        text += KpString(0, "%.8g", v);  // at most 16 characters, as a decimal string may have
    }
    put(item, tag, text);
}

void putPlace(DcmItem& data, const Volume& volume, long z)
{
    const Vector &x = volume.axes[0], &y = volume.axes[1], &normal = volume.axes[2];
    const double shift = static_cast<double>(z) * volume.spacing[2];
    put(data, DCM_InstanceNumber, KpString(0, "%ld", z + 1));
    putReals(data, DCM_ImagePositionPatient,
             {volume.origin[0] + shift * normal[0], volume.origin[1] + shift * normal[1],
              volume.origin[2] + shift * normal[2]});
    putReals(data, DCM_ImageOrientationPatient, {x[0], x[1], x[2], y[0], y[1], y[2]});
    putReals(data, DCM_PixelSpacing, {volume.spacing[1], volume.spacing[0]});
    putReals(data, DCM_SliceThickness, {volume.spacing[2]});
    putReals(data, DCM_SpacingBetweenSlices, {volume.spacing[2]});
    putReals(data, DCM_RescaleIntercept, {volume.intercept});
    putReals(data, DCM_RescaleSlope, {volume.slope});
}

void putPixels(DcmItem& data, Volume& volume, long z)
{
    const bool isSigned = volume.type == KpPrimType::Short;
    put(data, DCM_PhotometricInterpretation, "MONOCHROME2");
    data.putAndInsertUint16(DCM_SamplesPerPixel, 1);
    data.putAndInsertUint16(DCM_Rows, static_cast<Uint16>(volume.dims[1]));
    data.putAndInsertUint16(DCM_Columns, static_cast<Uint16>(volume.dims[0]));
    data.putAndInsertUint16(DCM_BitsAllocated, 16);
    data.putAndInsertUint16(DCM_BitsStored, 16);
    data.putAndInsertUint16(DCM_HighBit, 15);
    data.putAndInsertUint16(DCM_PixelRepresentation, isSigned ? 1 : 0);
    data.putAndInsertUint16Array(DCM_PixelData, static_cast<const Uint16*>(volume.slice(z).data),
                                 static_cast<unsigned long>(volume.sliceCount()));
}
