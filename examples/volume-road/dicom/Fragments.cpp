#include "Fragments.h"

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dccodec.h>
#include <dcmtk/dcmdata/dcpixseq.h>
#include <dcmtk/dcmdata/dcpxitem.h>
#include <dcmtk/dcmdata/dctk.h>

namespace {

DcmPixelSequence* sequenceOf(DcmPixelData& pixelData)
{
    E_TransferSyntax syntax = EXS_Unknown;
    const DcmRepresentationParameter* parameter = nullptr;
    DcmPixelSequence* sequence = nullptr;
    pixelData.getOriginalRepresentationKey(syntax, parameter);
    return pixelData.getEncapsulatedRepresentation(syntax, parameter, sequence).good() ? sequence : nullptr;
}

/// The numbers of the first fragment of a frame and of that after its last.
bool findFragments(DcmPixelSequence& sequence, Uint32 frame, Sint32 frames, Uint32& first, Uint32& end)
{
    first = 1;  // 0 is the table of offsets
    end = static_cast<Uint32>(sequence.card());
    if (frames <= 1)
        return true;
    if (DcmCodec::determineStartFragment(frame, frames, &sequence, first).bad())
        return false;
    const bool isLast = static_cast<Sint32>(frame) + 1 >= frames;
    return isLast || DcmCodec::determineStartFragment(frame + 1, frames, &sequence, end).good();
}

}  // namespace

std::vector<unsigned char> codestreamOf(DcmPixelData& pixelData, const Image& plane)
{
    std::vector<unsigned char> bytes;
    DcmPixelSequence* const sequence = sequenceOf(pixelData);
    Sint32 frames = 1;
    if (DcmItem* const parent = pixelData.getParentItem())
        parent->findAndGetSint32(DCM_NumberOfFrames, frames);
    Uint32 first = 0, end = 0;
    if (!sequence || !findFragments(*sequence, static_cast<Uint32>(plane.frame), frames, first, end))
        return bytes;
    for (Uint32 i = first; i < end; ++i) {
        DcmPixelItem* item = nullptr;
        Uint8* fragment = nullptr;
        if (sequence->getItem(item, i).bad() || item->getUint8Array(fragment).bad() || !fragment)
            return {};
        bytes.insert(bytes.end(), fragment, fragment + item->getLength());
    }
    return bytes;
}

int jpegPrecision(const std::vector<unsigned char>& codestream)
{
    size_t at = 2;  // after the start of the image: segments of a marker, a length and that many bytes
    while (at + 5 <= codestream.size() && codestream[at] == 0xff) {
        const unsigned marker = codestream[at + 1];
        if (marker == 0xff) {  // a fill byte
            ++at;
            continue;
        }
        const bool isFrame =
            (marker >= 0xc0 && marker <= 0xcf && marker != 0xc4 && marker != 0xc8 && marker != 0xcc) || marker == 0xf7;
        if (isFrame)
            return codestream[at + 4];
        at += 2 + (size_t{codestream[at + 2]} << 8 | codestream[at + 3]);
    }
    return 0;
}
