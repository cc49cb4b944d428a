#include "DerivedSeries.h"

#include "DicomPut.h"
#include "DicomTree.h"

#include <kplib/imaging/KpCreateUIDs.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/threads/ProgressScope.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <algorithm>

namespace {

constexpr auto seriesKind = KpCreateUIDs::UIDtype1, instanceKind = KpCreateUIDs::UIDtype2;

/// What a derived image has in common with its source: patient, study, space, how it was made, how to show it.
const DcmTagKey commonTags[] = {
    DCM_SpecificCharacterSet,
    DCM_SOPClassUID,
    DCM_StudyDate,
    DCM_StudyTime,
    DCM_AccessionNumber,
    DCM_Modality,
    DCM_Manufacturer,
    DCM_ReferringPhysicianName,
    DCM_StudyDescription,
    DCM_PatientName,
    DCM_PatientID,
    DCM_PatientBirthDate,
    DCM_PatientSex,
    DCM_BodyPartExamined,
    DCM_ScanningSequence,
    DCM_SequenceVariant,
    DCM_ScanOptions,
    DCM_MRAcquisitionType,
    DCM_KVP,
    DCM_RepetitionTime,
    DCM_EchoTime,
    DCM_EchoTrainLength,
    DCM_PatientPosition,
    DCM_StudyInstanceUID,
    DCM_FrameOfReferenceUID,
    DCM_StudyID,
    DCM_PositionReferenceIndicator,
    DCM_WindowCenter,
    DCM_WindowWidth,
    DCM_WindowCenterWidthExplanation,
    DCM_RescaleType,
};

std::string newUid(KpCreateUIDs::UIDtype kind)
{
    KpCreateUIDs creator;
    KpString uid;
    creator.createUID(kind, uid);
    return uid.c_str();
}

/// The volume with voxels of 16 bits, as images store them.
Volume inWords(Volume& volume)
{
    if (volume.type == KpPrimType::Short || volume.type == KpPrimType::UShort)
        return volume;
    Volume words = volume;
    words.type = KpPrimType::UShort;
    words.allocate();
    const auto count = static_cast<unsigned long>(volume.count());
    if (volume.type == KpPrimType::Byte) {
        KpRawData::memcpy(words.voxels(), volume.voxels(), volume.count());
        return words;
    }
    float low = 0, high = 0;
    KpRawData::getRange(volume.voxels(), count, low, high);
    constexpr double steps = 65535;
    const double range = static_cast<double>(high) - static_cast<double>(low);
    const double step = range > 0 ? range / steps : 1;
    KpRawData::mapLinear(words.voxels(), volume.voxels(), count, step / 2 - static_cast<double>(low), 1 / step);
    words.intercept = volume.intercept + static_cast<double>(low) * volume.slope;
    words.slope = volume.slope * step;
    return words;
}

void putSources(DcmItem& data, const std::string& sopClass, const Series& source, long first, long count)
{
    const long end = std::min(first + count, static_cast<long>(source.slices.size()));
    for (long i = first; i < end; ++i) {
        DcmItem* item = nullptr;
        data.findOrCreateSequenceItem(DCM_SourceImageSequence, item, i - first);
        put(*item, DCM_ReferencedSOPClassUID, sopClass.c_str());
        put(*item, DCM_ReferencedSOPInstanceUID, source.slices[static_cast<size_t>(i)].instanceUid.c_str());
    }
}

}  // namespace

KpResult writeDerived(Volume& reduced, const Series& source, long factor, const std::string& folder,
                      KpProgressInterface& progress, std::string& uid)
{
    const SliceFile& front = source.slices.front();
    DcmFileFormat first;
    if (KpResult loaded = loadDicom(front.path.c_str(), first); loaded.isBad())
        return loaded;
    OFString sopClass;
    first.getDataset()->findAndGetOFString(DCM_SOPClassUID, sopClass);
    factor = std::min(factor, static_cast<long>(source.slices.size()));
    uid = newUid(seriesKind);
    Volume words = inWords(reduced);
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(words.dims[2]), "");
    for (long z = 0; z < words.dims[2] && !progress.isCanceled(); ++z) {
        DcmFileFormat file;
        DcmDataset& data = *file.getDataset();
        for (const DcmTagKey& tag : commonTags)
            first.getDataset()->findAndInsertCopyOfElement(tag, &data);
        put(data, DCM_ImageType, "DERIVED\\SECONDARY");
        put(data, DCM_SOPInstanceUID, newUid(instanceKind).c_str());
        put(data, DCM_SeriesInstanceUID, uid.c_str());
        put(data, DCM_SeriesNumber, "1001");
        put(data, DCM_SeriesDescription, "reduced by mean");
        put(data, DCM_DerivationDescription, KpString(0, "mean of blocks of %ld slices", factor));
        putSources(data, sopClass.c_str(), source, z * factor, factor);
        putPlace(data, words, z);
        putPixels(data, words, z);
        // The values run as they did in the source, dark ones high or low.
        put(data, DCM_PhotometricInterpretation, front.isInverted ? "MONOCHROME1" : "MONOCHROME2");
        const KpString path(0, "%s/image%04ld.dcm", folder.c_str(), z + 1);
        const OFCondition status = file.saveFile(path.c_str(), EXS_LittleEndianExplicit);
        if (status.bad())
            return badInput("can't write '%s': %s", path.c_str(), status.text());
        progress.nextStep();
    }
    return KpResult();
}
