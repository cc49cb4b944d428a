// The DICOM toolkit of the distribution has no decoder for JPEG 2000. OpenJPEG is the reference implementation of the
// standard, is maintained, and decodes from memory through a small interface.
#include "Jpeg2000.h"

#include "Fragments.h"

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <openjpeg.h>
#include <vector>

#include <algorithm>
#include <cstring>
#include <memory>

namespace {

struct Bytes {
    std::vector<unsigned char> data;
    size_t at = 0;
};

OPJ_SIZE_T readBytes(void* buffer, OPJ_SIZE_T size, void* user)
{
    auto& bytes = *static_cast<Bytes*>(user);
    const size_t n = std::min(size, bytes.data.size() - bytes.at);
    if (n == 0)
        return static_cast<OPJ_SIZE_T>(-1);
    std::memcpy(buffer, bytes.data.data() + bytes.at, n);
    bytes.at += n;
    return n;
}

OPJ_OFF_T skipBytes(OPJ_OFF_T size, void* user)
{
    auto& bytes = *static_cast<Bytes*>(user);
    const size_t n = std::min(static_cast<size_t>(std::max<OPJ_OFF_T>(size, 0)), bytes.data.size() - bytes.at);
    bytes.at += n;
    return static_cast<OPJ_OFF_T>(n);
}

OPJ_BOOL seekBytes(OPJ_OFF_T position, void* user)
{
    auto& bytes = *static_cast<Bytes*>(user);
    if (position < 0 || static_cast<size_t>(position) > bytes.data.size())
        return OPJ_FALSE;
    bytes.at = static_cast<size_t>(position);
    return OPJ_TRUE;
}

using Image2000 = std::unique_ptr<opj_image_t, decltype(&opj_image_destroy)>;

Image2000 decode(Bytes& bytes)
{
    const std::unique_ptr<opj_stream_t, decltype(&opj_stream_destroy)> stream(opj_stream_default_create(OPJ_TRUE),
                                                                              opj_stream_destroy);
    opj_stream_set_user_data(stream.get(), &bytes, nullptr);
    opj_stream_set_user_data_length(stream.get(), bytes.data.size());
    opj_stream_set_read_function(stream.get(), readBytes);
    opj_stream_set_skip_function(stream.get(), skipBytes);
    opj_stream_set_seek_function(stream.get(), seekBytes);
    const bool isBoxed = bytes.data.size() > 12 && std::memcmp(bytes.data.data() + 4, "jP  ", 4) == 0;
    const std::unique_ptr<opj_codec_t, decltype(&opj_destroy_codec)> codec(
        opj_create_decompress(isBoxed ? OPJ_CODEC_JP2 : OPJ_CODEC_J2K), opj_destroy_codec);
    opj_dparameters_t parameters;
    opj_set_default_decoder_parameters(&parameters);
    opj_image_t* found = nullptr;
    const bool isRead =
        opj_setup_decoder(codec.get(), &parameters) && opj_read_header(stream.get(), codec.get(), &found);
    Image2000 image(found, opj_image_destroy);
    if (!isRead || !opj_decode(codec.get(), stream.get(), image.get()) ||
        !opj_end_decompress(codec.get(), stream.get()))
        image.reset();
    return image;
}

/// Whether the codestream holds the samples that the header announces.
bool isExpected(const opj_image_t& image, const Image& plane)
{
    const auto width = static_cast<OPJ_UINT32>(plane.columns * plane.tilesAcross);
    const auto height = static_cast<OPJ_UINT32>(plane.rows * plane.tilesAcross);
    bool isRight = image.numcomps == static_cast<OPJ_UINT32>(plane.format.samples);
    for (OPJ_UINT32 c = 0; isRight && c < image.numcomps; ++c)
        isRight = image.comps[c].w == width && image.comps[c].h == height && image.comps[c].data;
    return isRight;
}

template <typename Word>
void copySamples(const opj_image_t& image, Word* to)
{
    const size_t n = static_cast<size_t>(image.comps[0].w) * image.comps[0].h;
    for (size_t i = 0; i < n; ++i) {
        for (OPJ_UINT32 c = 0; c < image.numcomps; ++c)
            *to++ = static_cast<Word>(image.comps[c].data[i]);
    }
}

}  // namespace

bool isJpeg2000(const std::string& syntax)
{
    return syntax == UID_JPEG2000LosslessOnlyTransferSyntax || syntax == UID_JPEG2000TransferSyntax;
}

KpResult decodeJpeg2000(DcmPixelData& pixelData, const Image& plane, unsigned char* pixels)
{
    Bytes bytes{codestreamOf(pixelData, plane)};
    if (bytes.data.empty())
        return badInput("%s has compressed pixels whose frames cannot be found", plane.name().c_str());
    const Image2000 image = decode(bytes);
    if (!image || !isExpected(*image, plane))
        return badInput("%s has pixels in %s that cannot be decoded", plane.name().c_str(),
                        plane.transferSyntax.c_str());
    switch (plane.format.bitsAllocated) {
    case 8:
        copySamples(*image, pixels);
        break;
    case 16:
        copySamples(*image, reinterpret_cast<Uint16*>(pixels));
        break;
    default:
        copySamples(*image, reinterpret_cast<Uint32*>(pixels));
    }
    return KpResult();
}
