#include "Pixels.h"

#include "Colour.h"
#include "DicomTree.h"
#include "Fragments.h"
#include "Jpeg2000.h"
#include "StoredValues.h"

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dcrledrg.h>
#include <dcmtk/dcmdata/dctk.h>
#include <dcmtk/dcmjpeg/djdecode.h>
#include <dcmtk/dcmjpls/djdecode.h>

#include <utility>

namespace {

/// The bits of one frame as bytes. Frames follow each other without a gap, the lowest bit of a byte first.
bool copyBits(DcmItem& data, const Image& plane, unsigned char* to)
{
    const Uint8* bytes = nullptr;
    unsigned long available = 0;
    const unsigned long n = static_cast<unsigned long>(plane.rows) * static_cast<unsigned long>(plane.columns);
    if (data.findAndGetUint8Array(DCM_PixelData, bytes, &available).bad() || available * 8 < (plane.frame + 1) * n)
        return false;
    for (unsigned long i = 0, bit = plane.frame * n; i < n; ++i, ++bit)
        to[i] = bytes[bit / 8] >> (bit % 8) & 1;
    return true;
}

/// Pixels of 32 bits are read as pairs of 16-bit words, which stand in the wrong order in a big-endian file.
void swapHalves(unsigned char* pixels, long size)
{
    auto* const words = reinterpret_cast<Uint16*>(pixels);
    for (long i = 0; i + 1 < size / 2; i += 2)
        std::swap(words[i], words[i + 1]);
}

/// A codestream of 8 bits is decoded into bytes, also where the header announces words.
void widen(unsigned char* pixels, long samples)
{
    auto* const words = reinterpret_cast<Uint16*>(pixels);
    for (long i = samples - 1; i >= 0; --i)
        words[i] = pixels[i];
}

long bytesOfFrame(const Image& plane)
{
    const long across = plane.tilesAcross;
    return static_cast<long>(plane.rows) * plane.columns * across * across * plane.format.samples *
           plane.format.bitsAllocated / 8;
}

}  // namespace

PixelReader::PixelReader() = default;
PixelReader::~PixelReader() = default;

KpResult PixelReader::open(const Image& plane)
{
    if (file_ && path_ == plane.path)
        return KpResult();
    hasFrame_ = false;
    path_ = plane.path;
    file_ = std::make_unique<DcmFileFormat>();
    KpResult loaded = loadDicom(path_.c_str(), *file_);
    if (loaded.isBad())
        file_.reset();
    return loaded;
}

KpResult PixelReader::decode(const Image& plane)
{
    if (hasFrame_ && frame_ == plane.frame)
        return KpResult();
    hasFrame_ = false;
    DcmDataset& data = *file_->getDataset();
    DcmElement* element = nullptr;
    data.findAndGetElement(DCM_PixelData, element);
    auto* const pixelData = dynamic_cast<DcmPixelData*>(element);
    if (!pixelData)
        return badInput("%s has no pixel data", plane.name().c_str());
    pixels_.resize(bytesOfFrame(plane) + 2);  // compressed frames are padded to an even size
    photometric_ = plane.format.photometric;
    isPlanar_ = plane.format.isPlanar != 0 && plane.format.samples == 3;
    KpResult decoded;
    if (isJpeg2000(DcmXfer(data.getOriginalXfer()).getXferID())) {
        decoded = decodeJpeg2000(*pixelData, plane, pixels_.data());
        isPlanar_ = false;
        if (plane.format.samples == 3)
            photometric_ = "RGB";
    } else {
        decoded = decodeByToolkit(*pixelData, plane);
    }
    hasFrame_ = decoded.isOk();
    frame_ = plane.frame;
    return decoded;
}

KpResult PixelReader::decodeByToolkit(DcmPixelData& pixelData, const Image& plane)
{
    DcmDataset& data = *file_->getDataset();
    const DcmXfer transfer(data.getOriginalXfer());
    Uint32 fragment = 0;
    OFString model;
    const OFCondition status = pixelData.getUncompressedFrame(
        &data, static_cast<Uint32>(plane.frame), fragment, pixels_.data(), static_cast<Uint32>(pixels_.size()), model);
    if (!transfer.isEncapsulated()) {
        if (status.bad())
            return badInput("%s is cut off: %s", plane.name().c_str(), status.text());
        if (plane.format.bitsAllocated == 32 && transfer.getByteOrder() == EBO_BigEndian)
            swapHalves(pixels_.data(), pixels_.size() - 2);
        return KpResult();
    }
    if (status.bad())
        return badInput("%s has pixels in %s that cannot be decoded: %s", plane.name().c_str(),
                        plane.transferSyntax.c_str(), status.text());
    if (!model.empty())
        photometric_ = model.c_str();
    if (transfer.getXfer() == EXS_RLELossless)
        return KpResult();
    isPlanar_ = false;
    const int bits = jpegPrecision(codestreamOf(pixelData, plane));
    if (bits > 0 && bits <= 8 && plane.format.bitsAllocated == 16)
        widen(pixels_.data(), (pixels_.size() - 2) / 2);
    return KpResult();
}

KpResult PixelReader::read(const Image& plane, void* stored)
{
    if (KpResult opened = open(plane); opened.isBad())
        return opened;
    if (plane.format.bitsAllocated == 1)
        return copyBits(*file_->getDataset(), plane, static_cast<unsigned char*>(stored))
                   ? KpResult()
                   : badInput("%s is cut off", plane.name().c_str());
    if (KpResult decoded = decode(plane); decoded.isBad())
        return decoded;
    if (plane.format.isColour())
        return toColours(*file_->getDataset(), plane, photometric_, isPlanar_, pixels_.data(),
                         static_cast<unsigned char*>(stored));
    copyValues(pixels_.data(), plane, stored);
    return KpResult();
}

void registerDecoders()
{
    // Attributes that passed a system which did not know them have no VR in the file; the dictionary has it.
    dcmEnableUnknownVRConversion.set(OFTrue);
    DJDecoderRegistration::registerCodecs(EDC_photometricInterpretation, EUC_default, EPC_colorByPixel);
    DJLSDecoderRegistration::registerCodecs(EJLSUC_never, EJLSPC_colorByPixel);
    DcmRLEDecoderRegistration::registerCodecs();
}
