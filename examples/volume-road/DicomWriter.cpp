#include "DicomWriter.h"

#include <kplib/threads/ProgressScope.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <ctime>

namespace {

const DcmTag privateCreatorTag(0x0009, 0x0010, EVR_LO);
const DcmTag privateSourceTag(0x0009, 0x1001, EVR_LO);
const DcmTag privateSlicesTag(0x0009, 0x1002, EVR_IS);
constexpr const char* privateCreator = "VOLUME ROAD EXAMPLE";

struct Uids {
    char study[100], series[100], frame[100];
    Uids()
    {
        dcmGenerateUniqueIdentifier(study, SITE_STUDY_UID_ROOT);
        dcmGenerateUniqueIdentifier(series, SITE_SERIES_UID_ROOT);
        dcmGenerateUniqueIdentifier(frame, SITE_SERIES_UID_ROOT);
    }
};

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

void putStudy(DcmItem& data, const Uids& uids, const SeriesText& text)
{
    char day[16], time[16];
    const std::time_t now = std::time(nullptr);
    std::tm local{};
    localtime_r(&now, &local);
    std::strftime(day, sizeof day, "%Y%m%d", &local);
    std::strftime(time, sizeof time, "%H%M%S", &local);
    put(data, DCM_ImageType, "DERIVED\\SECONDARY");
    put(data, DCM_SOPClassUID, UID_MRImageStorage);
    put(data, DCM_StudyDate, day);
    put(data, DCM_StudyTime, time);
    put(data, DCM_AccessionNumber, "");
    put(data, DCM_Modality, "MR");
    put(data, DCM_Manufacturer, "volume-road");
    put(data, DCM_ReferringPhysicianName, "");
    put(data, DCM_StudyDescription, text.studyDescription);
    put(data, DCM_SeriesDescription, text.seriesDescription);
    put(data, DCM_PatientName, "Example^Head");
    put(data, DCM_PatientID, "EXAMPLE-1");
    put(data, DCM_PatientBirthDate, "");
    put(data, DCM_PatientSex, "O");
    put(data, DCM_BodyPartExamined, "HEAD");
    put(data, DCM_PatientPosition, "HFS");
    put(data, DCM_StudyInstanceUID, uids.study);
    put(data, DCM_SeriesInstanceUID, uids.series);
    put(data, DCM_FrameOfReferenceUID, uids.frame);
    put(data, DCM_PositionReferenceIndicator, "");
    put(data, DCM_StudyID, "1");
    put(data, DCM_SeriesNumber, "1");
}

void putRegion(DcmItem& data)
{
    DcmItem* item = nullptr;
    data.findOrCreateSequenceItem(DCM_AnatomicRegionSequence, item, 0);
    put(*item, DCM_CodeValue, "69536005");
    put(*item, DCM_CodingSchemeDesignator, "SCT");
    put(*item, DCM_CodeMeaning, "Head");
}

void putImage(DcmItem& data, Volume& volume, const SeriesText& text, long z)
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
    put(data, DCM_RescaleType, "US");
    putReals(data, DCM_WindowCenter, {text.windowCenter});
    putReals(data, DCM_WindowWidth, {text.windowWidth});
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

void putPrivate(DcmItem& data, const Volume& volume, const SeriesText& text)
{
    put(data, privateCreatorTag, privateCreator);
    put(data, privateSourceTag, text.source);
    put(data, privateSlicesTag, KpString(0, "%ld", volume.dims[2]));
}

}  // namespace

KpResult writeSeries(Volume& volume, const SeriesText& text, const char* folder, KpProgressInterface& progress)
{
    if (volume.dims[0] > 65535 || volume.dims[1] > 65535)
        return badInput("a slice of %ld x %ld is too large for a DICOM image", volume.dims[0], volume.dims[1]);
    const Uids uids;
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(volume.dims[2]), "Writing images");
    for (long z = 0; z < volume.dims[2] && !progress.isCanceled(); ++z) {
        DcmFileFormat file;
        DcmDataset& data = *file.getDataset();
        char instance[100];
        put(data, DCM_SOPInstanceUID, dcmGenerateUniqueIdentifier(instance, SITE_INSTANCE_UID_ROOT));
        putStudy(data, uids, text);
        putRegion(data);
        putImage(data, volume, text, z);
        putPixels(data, volume, z);
        putPrivate(data, volume, text);
        const KpString path(0, "%s/image%04ld.dcm", folder, z + 1);
        const OFCondition status = file.saveFile(path.c_str(), EXS_LittleEndianExplicit);
        if (status.bad())
            return badInput("can't write '%s': %s", path.c_str(), status.text());
        progress.nextStep();
    }
    return KpResult();
}
