#include "DicomWriter.h"

#include "DicomPut.h"

#include <kplib/threads/ProgressScope.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <array>
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

void putStudy(DcmItem& data, const Uids& uids, const SeriesText& text)
{
    char day[16], time[16];
    const std::time_t now = std::time(nullptr);
    std::tm local{};
    localtime_r(&now, &local);
    std::strftime(day, sizeof day, "%Y%m%d", &local);
    std::strftime(time, sizeof time, "%H%M%S", &local);
    put(data, DCM_ImageType, "DERIVED\\SECONDARY\\OTHER");
    put(data, DCM_AcquisitionNumber, "1");
    put(data, DCM_ScanningSequence, "RM");
    put(data, DCM_SequenceVariant, "NONE");
    put(data, DCM_ScanOptions, "");
    put(data, DCM_MRAcquisitionType, "3D");
    put(data, DCM_RepetitionTime, "");
    put(data, DCM_EchoTime, "");
    put(data, DCM_EchoTrainLength, "");
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
        putPlace(data, volume, z);
        put(data, DCM_RescaleType, "US");
        putReals(data, DCM_WindowCenter, {text.windowCenter});
        putReals(data, DCM_WindowWidth, {text.windowWidth});
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
