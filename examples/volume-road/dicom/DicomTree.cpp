#include "DicomTree.h"

#include "../volume/Volume.h"
#include "FrameValues.h"

#include <kplib/param/HxParameter.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dcpixseq.h>
#include <dcmtk/dcmdata/dcpxitem.h>
#include <dcmtk/dcmdata/dctk.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <string>

namespace {

constexpr Uint32 longestInMemory = 65536;  // larger values stay on disk until they are asked for

/// How many bytes of a value are printed; of longer values the size is.
Uint32 longestPrinted(const DcmElement& element)
{
    constexpr Uint32 opaque = 64, numbers = 4096, text = 0xffffffff;
    const DcmTag& tag = element.getTag();
    if ((tag.getGTag() & 0xff00) == 0x6000 && tag.getETag() == 0x3000)  // an overlay
        return opaque;
    switch (element.ident()) {
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
    case EVR_lt:
        return opaque;
    case EVR_FD:
    case EVR_FL:
    case EVR_US:
    case EVR_SS:
    case EVR_UL:
    case EVR_SL:
    case EVR_SV:
    case EVR_UV:
    case EVR_xs:
        return numbers;
    default:
        return text;
    }
}

/// Bytes of the fragments of compressed pixels, the table of offsets left out.
unsigned long encapsulatedSize(DcmElement& element, unsigned long& fragments)
{
    auto* const pixelData = dynamic_cast<DcmPixelData*>(&element);
    fragments = 0;
    if (!pixelData)
        return 0;
    E_TransferSyntax syntax = EXS_Unknown;
    const DcmRepresentationParameter* parameter = nullptr;
    DcmPixelSequence* sequence = nullptr;
    pixelData->getOriginalRepresentationKey(syntax, parameter);
    unsigned long bytes = 0;
    if (pixelData->getEncapsulatedRepresentation(syntax, parameter, sequence).bad() || !sequence)
        return 0;
    for (unsigned long i = 1; i < sequence->card(); ++i, ++fragments) {
        DcmPixelItem* item = nullptr;
        if (sequence->getItem(item, i).good())
            bytes += item->getLength();
    }
    return bytes;
}

KpString sizeOf(DcmElement& element)
{
    unsigned long fragments = 0;
    if (element.getTag() == DCM_PixelData && element.ident() != EVR_SQ) {
        const unsigned long bytes = encapsulatedSize(element, fragments);
        if (fragments > 0)
            return KpString(0, "(%lu bytes in %lu fragments, compressed)", bytes, fragments);
    }
    return KpString(0, "(%lu bytes)", static_cast<unsigned long>(element.getLength()));
}

/// Control characters would let a value pass for a line of the tree: they become dots. Line ends stay blanks.
void makePrintable(KpString& text)
{
    for (long i = 0; i < text.length(); ++i) {
        char& c = text.data()[i];
        if (c == '\n' || c == '\r' || c == '\t')
            c = ' ';
        else if (static_cast<unsigned char>(c) < 32 || c == 127)
            c = '.';
    }
}

KpString descriptionOf(DcmItem& parent, DcmElement& element)
{
    DcmTag tag = element.getTag();
    KpString description = tag.isPrivateReservation() ? "PrivateCreator" : tag.getTagName();
    if (const std::string creator = creatorOf(parent, tag); !creator.empty())
        description = KpString(0, "[%s] %s", creator.c_str(), description.c_str());
    description.replaceSubStr(":", "");  // a colon ends the description
    return description;
}

}  // namespace

std::string creatorOf(DcmItem& parent, const DcmTag& tag)
{
    OFString creator;
    if (tag.isPrivate() && !tag.isPrivateReservation())
        parent.findAndGetOFString(DcmTagKey(tag.getGTag(), static_cast<Uint16>(tag.getETag() >> 8)), creator);
    return creator.c_str();
}

KpString valueText(DcmElement& element)
{
    if (element.getLength() > longestPrinted(element) || element.getTag() == DCM_PixelData)
        return sizeOf(element);
    KpString text(textOf(element).c_str());
    makePrintable(text);
    return text;
}

namespace {

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
            const KpString text = descriptionOf(dataSet, element) + ": " + valueText(element);
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

bool canRead(const char* path)
{
    FILE* const f = std::fopen(path, "rb");
    char first = 0;
    const bool isReadable = f && (std::fread(&first, 1, 1, f) == 1 || std::ferror(f) == 0);
    const int cause = errno;
    if (f)
        std::fclose(f);
    errno = cause;
    return isReadable;
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
    const OFCondition status = file.loadFile(path, EXS_Unknown, EGL_noChange, longestInMemory);
    if (status.good() && file.getDataset()->card() == 0)
        return badInput("'%s' is not a DICOM file", path);
    if (status.good())
        return KpResult();
    if (!canRead(path))
        return badInput("can't open '%s': %s", path, std::strerror(errno));
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
