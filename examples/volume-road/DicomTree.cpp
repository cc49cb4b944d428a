#include "DicomTree.h"

#include "Volume.h"

#include <kplib/param/HxParameter.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <cstdio>
#include <cstring>

namespace {

constexpr Uint32 longestBinary = 64;       // bytes; more of a binary value is told by its length
constexpr Uint32 longestInMemory = 65536;  // larger values stay on disk until they are asked for

bool isBinary(DcmEVR vr)
{
    switch (vr) {
    case EVR_OB:
    case EVR_OW:
    case EVR_OF:
    case EVR_OD:
    case EVR_OL:
    case EVR_OV:
    case EVR_ox:
    case EVR_px:
    case EVR_UN:
    case EVR_UNKNOWN:
    case EVR_UNKNOWN2B:
    case EVR_PixelData:
        return true;
    default:
        return false;
    }
}

KpString valueOf(DcmElement& element)
{
    if (isBinary(element.ident()) && element.getLength() > longestBinary)
        return KpString(0, "(%lu bytes)", static_cast<unsigned long>(element.getLength()));
    OFString text;
    if (element.getOFStringArray(text).bad())
        return KpString(0, "(%lu bytes)", static_cast<unsigned long>(element.getLength()));
    return KpString(text.c_str());
}

KpString descriptionOf(DcmElement& element)
{
    DcmTag tag = element.getTag();
    KpString description = tag.isPrivateReservation() ? "PrivateCreator" : tag.getTagName();
    description.replaceSubStr(":", "");  // a colon ends the description
    return description;
}

void addSequence(HxParamBundle& all, const char* name, DcmSequenceOfItems& sequence)
{
    HxParamBundle* const bundle = HxParamBundle::create(name);
    all.insert(bundle, 0);
    for (unsigned long i = 0; i < sequence.card(); ++i) {
        HxParamBundle* const item = HxParamBundle::create(KpString(0, "Item_%lu", i));
        bundle->insert(item, 0);
        fillTree(*item, *sequence.getItem(i));
    }
}

}  // namespace

void fillTree(HxParamBundle& all, DcmItem& dataSet)
{
    bool hasPrivateBlocks = false;
    for (unsigned long i = 0; i < dataSet.card(); ++i) {
        DcmElement& element = *dataSet.getElement(i);
        const DcmTag& tag = element.getTag();
        const KpString name(0, "G%04X-%04X", tag.getGTag(), tag.getETag());
        hasPrivateBlocks = hasPrivateBlocks || tag.isPrivateReservation();
        if (element.ident() == EVR_SQ) {
            addSequence(all, name, static_cast<DcmSequenceOfItems&>(element));
        } else {
            const KpString text = descriptionOf(element) + ": " + valueOf(element);
            all.insert(HxParameter::create(name, text), 0);
        }
    }
    if (hasPrivateBlocks)
        all.findPrivateTagInAll("", "G0009-0000", nullptr);  // the first look-up makes the index of creators
}

void fillHeader(HxParamBundle& root, DcmFileFormat& file)
{
    DcmDataset& dataSet = *file.getDataset();
    dataSet.convertToUTF8();  // where the character set is unknown, the bytes stay as they are
    HxParamBundle& all = *root.dicomAllCreate();
    fillTree(all, *file.getMetaInfo());
    fillTree(all, dataSet);
}

bool hasDicomMark(const char* path)
{
    char start[132] = {};
    FILE* const f = std::fopen(path, "rb");
    if (!f)
        return false;
    const bool isMarked =
        std::fread(start, 1, sizeof start, f) == sizeof start && std::memcmp(start + 128, "DICM", 4) == 0;
    std::fclose(f);
    return isMarked;
}

KpResult loadDicom(const char* path, DcmFileFormat& file)
{
    OFCondition status = file.loadFile(path, EXS_Unknown, EGL_noChange, longestInMemory);
    if (status.good() && file.getDataset()->card() == 0)
        return badInput("'%s' is not a DICOM file", path);
    if (status.good())
        status = file.loadAllDataIntoMemory();
    if (status.good())
        return KpResult();
    if (!hasDicomMark(path))
        return badInput("'%s' is not a DICOM file", path);
    return badInput("'%s' is cut off or damaged: %s", path, status.text());
}

KpResult readHeader(const char* path, HxParamBundle& root)
{
    DcmFileFormat file;
    KpResult loaded = loadDicom(path, file);
    if (loaded.isOk())
        fillHeader(root, file);
    return loaded;
}
