#include "DerivedSeries.h"

#include "DicomPut.h"
#include "DicomTree.h"

#include <kplib/imaging/KpCreateUIDs.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/threads/ProgressScope.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <algorithm>
#include <array>
#include <initializer_list>
#include <vector>

namespace {

constexpr auto seriesKind = KpCreateUIDs::UIDtype1, instanceKind = KpCreateUIDs::UIDtype2;

/// What a derived image has in common with its source: patient, study, space, how it was made, how to show it.
const DcmTagKey commonTags[] = {
    DCM_SpecificCharacterSet,
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
    DCM_Laterality,
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
    if (volume.type == KpPrimType::Short || volume.type == KpPrimType::UShort || volume.components == 3)
        return volume;
    Volume words = volume.withoutVoxels();
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
    words.padding = {};  // no longer a value of its own
    return words;
}

/// The class of the images: enhanced objects and mosaics become single-frame images of their modality.
const char* classOf(const Image& plane, int components)
{
    if (components == 3)
        return UID_SecondaryCaptureImageStorage;
    if (plane.modality == "MR")
        return UID_MRImageStorage;
    if (plane.modality == "CT")
        return UID_CTImageStorage;
    return UID_SecondaryCaptureImageStorage;
}

/// Attributes that images of the class have to have, where the source lacks them.
void putRequired(DcmItem& data, const std::string& sopClass)
{
    const auto require = [&](const DcmTag& tag, const char* text) {
        if (!data.tagExists(tag))
            put(data, tag, text);
    };
    for (const DcmTag& tag :
         {DcmTag(DCM_StudyDate), DcmTag(DCM_StudyTime), DcmTag(DCM_AccessionNumber), DcmTag(DCM_ReferringPhysicianName),
          DcmTag(DCM_PatientName), DcmTag(DCM_PatientID), DcmTag(DCM_PatientBirthDate), DcmTag(DCM_PatientSex),
          DcmTag(DCM_StudyID), DcmTag(DCM_Manufacturer), DcmTag(DCM_PositionReferenceIndicator),
          DcmTag(DCM_PatientPosition)})
        require(tag, "");
    // An unpaired body part has no side; without a body part an unknown side is written.
    if (!data.tagExists(DCM_BodyPartExamined))
        require(DCM_Laterality, "");
    else if (!data.tagExistsWithValue(DCM_Laterality))
        data.findAndDeleteElement(DCM_Laterality);
    require(DCM_AcquisitionNumber, "");
    if (sopClass == UID_SecondaryCaptureImageStorage) {
        put(data, DCM_ConversionType, "WSD");
        require(DCM_PatientOrientation, "");
        if (data.tagExists(DCM_RescaleSlope))
            require(DCM_RescaleType, "US");
        return;
    }
    if (sopClass == UID_CTImageStorage) {
        require(DCM_KVP, "");
        require(DCM_RescaleType, "HU");
        return;
    }
    require(DCM_ScanningSequence, "RM");
    require(DCM_SequenceVariant, "NONE");
    for (const DcmTag& tag : {DcmTag(DCM_ScanOptions), DcmTag(DCM_MRAcquisitionType), DcmTag(DCM_RepetitionTime),
                              DcmTag(DCM_EchoTime), DcmTag(DCM_EchoTrainLength), DcmTag(DCM_SliceThickness)})
        require(tag, "");
}

void putImageType(DcmItem& data, DcmItem& source, const std::string& sopClass)
{
    OFString third;
    source.findAndGetOFString(DCM_ImageType, third, 2);
    if (third.empty() || sopClass == UID_MRImageStorage)
        third = sopClass == UID_CTImageStorage ? "AXIAL" : "OTHER";
    put(data, DCM_ImageType, ("DERIVED\\SECONDARY\\" + third).c_str());
}

void putWindow(DcmItem& data, const Windows& windows)
{
    if (windows.presets.empty())
        return;
    const Window window = windows.of(windows.presets.front());
    putReals(data, DCM_WindowCenter, {window.center});
    putReals(data, DCM_WindowWidth, {window.width});
    if (window.function != Window::Linear)
        put(data, DCM_VOILUTFunction, nameOf(window.function));
}

/// The instances that a slice was made of, each once.
void putSources(DcmItem& data, const std::string& sopClass, const Series& source, long first, long count)
{
    const long end = std::min(first + count, static_cast<long>(source.planes.size()));
    std::vector<std::string> instances;
    for (long i = first; i < end; ++i) {
        const std::string& uid = source.planes[static_cast<size_t>(i)].instanceUid;
        if (std::find(instances.begin(), instances.end(), uid) != instances.end())
            continue;
        DcmItem* item = nullptr;
        data.findOrCreateSequenceItem(DCM_SourceImageSequence, item, static_cast<long>(instances.size()));
        put(*item, DCM_ReferencedSOPClassUID, sopClass.c_str());
        put(*item, DCM_ReferencedSOPInstanceUID, uid.c_str());
        instances.push_back(uid);
    }
}

/// One image of the derived series, but for its own UID.
void fillImage(DcmDataset& data, DcmDataset& first, const Series& source, Volume& words, long z, long factor,
               const std::string& uid)
{
    OFString sourceClass;
    first.findAndGetOFString(DCM_SOPClassUID, sourceClass);
    const std::string sopClass = classOf(source.planes.front(), words.components);
    for (const DcmTagKey& tag : commonTags)
        first.findAndInsertCopyOfElement(tag, &data);
    put(data, DCM_SOPClassUID, sopClass.c_str());
    put(data, DCM_SOPInstanceUID, newUid(instanceKind).c_str());
    put(data, DCM_SeriesInstanceUID, uid.c_str());
    put(data, DCM_SeriesNumber, "1001");
    put(data, DCM_SeriesDescription, "reduced by mean");
    put(data, DCM_DerivationDescription, KpString(0, "mean of blocks of %ld slices", factor));
    putImageType(data, first, sopClass);
    putSources(data, sourceClass.c_str(), source, z * factor, factor);
    putPlace(data, words, z);
    putPixels(data, words, z);
    putRequired(data, sopClass);
    if (words.components == 3)
        return;
    putWindow(data, source.windows);
    // The values run as they did in the source, dark ones high or low.
    put(data, DCM_PhotometricInterpretation, source.windows.isInverted ? "MONOCHROME1" : "MONOCHROME2");
}

}  // namespace

KpResult writeDerived(Volume& reduced, const Series& source, long factor, const std::string& folder,
                      KpProgressInterface& progress, std::string& uid)
{
    DcmFileFormat first;
    if (KpResult loaded = loadDicom(source.planes.front().path.c_str(), first); loaded.isBad())
        return loaded;
    factor = std::min(factor, static_cast<long>(source.planes.size()));
    uid = newUid(seriesKind);
    Volume words = inWords(reduced);
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(words.dims[2]), "");
    for (long z = 0; z < words.dims[2] && !progress.isCanceled(); ++z) {
        DcmFileFormat file;
        fillImage(*file.getDataset(), *first.getDataset(), source, words, z, factor, uid);
        const KpString path(0, "%s/image%04ld.dcm", folder.c_str(), z + 1);
        const OFCondition status = file.saveFile(path.c_str(), EXS_LittleEndianExplicit);
        if (status.bad())
            return badInput("can't write '%s': %s", path.c_str(), status.text());
        progress.nextStep();
    }
    return KpResult();
}
