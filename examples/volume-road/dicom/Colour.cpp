#include "Colour.h"

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <algorithm>
#include <cmath>
#include <vector>

namespace {

/// One table of a palette; entries of 8 bits.
struct Table {
    std::vector<unsigned char> entries;
    long first = 0;

    unsigned char at(long value) const
    {
        return entries[static_cast<size_t>(std::clamp(value - first, 0L, static_cast<long>(entries.size()) - 1))];
    }
};

bool readTable(DcmItem& data, const DcmTagKey& descriptor, const DcmTagKey& values, const PixelFormat& format,
               Table& table)
{
    DcmElement *description = nullptr, *element = nullptr;
    if (data.findAndGetElement(descriptor, description).bad() || data.findAndGetElement(values, element).bad())
        return false;
    Uint16 count = 0, first = 0, bits = 0;
    Sint16 signedFirst = 0;
    const bool isSignedFirst = description->ident() == EVR_SS && description->getSint16(signedFirst, 1).good();
    if (description->ident() == EVR_SS) {
        Sint16 signedCount = 0, signedBits = 0;
        description->getSint16(signedCount, 0);
        description->getSint16(signedBits, 2);
        count = static_cast<Uint16>(signedCount);
        bits = static_cast<Uint16>(signedBits);
    } else if (description->getUint16(count, 0).bad() || description->getUint16(first, 1).bad() ||
               description->getUint16(bits, 2).bad()) {
        return false;
    }
    table.first = isSignedFirst ? signedFirst : format.isSigned ? static_cast<Sint16>(first) : first;
    const size_t n = count == 0 ? 65536 : count;
    table.entries.resize(n);
    Uint16* words = nullptr;
    if (element->getLength() >= 2 * n && element->getUint16Array(words).good() && words) {
        for (size_t i = 0; i < n; ++i)
            table.entries[i] = static_cast<unsigned char>(bits > 8 ? words[i] >> 8 : words[i]);
        return true;
    }
    if (element->getLength() < n || element->getUint16Array(words).bad() || !words)
        return false;
    for (size_t i = 0; i < n; ++i)  // two entries a word, the first in its low byte
        table.entries[i] = static_cast<unsigned char>(words[i / 2] >> (i % 2 * 8));
    return true;
}

KpResult throughPalette(DcmItem& data, const Image& plane, const unsigned char* pixels, unsigned char* rgb)
{
    Table red, green, blue;
    const PixelFormat& format = plane.format;
    if (!readTable(data, DCM_RedPaletteColorLookupTableDescriptor, DCM_RedPaletteColorLookupTableData, format, red) ||
        !readTable(data, DCM_GreenPaletteColorLookupTableDescriptor, DCM_GreenPaletteColorLookupTableData, format,
                   green) ||
        !readTable(data, DCM_BluePaletteColorLookupTableDescriptor, DCM_BluePaletteColorLookupTableData, format, blue))
        return badInput("%s has a palette that cannot be read", plane.name().c_str());
    const long n = static_cast<long>(plane.rows) * plane.columns;
    const long mask = (1L << format.bitsStored) - 1;
    for (long i = 0; i < n; ++i) {
        const long bits = format.bitsAllocated == 8 ? pixels[i] : reinterpret_cast<const Uint16*>(pixels)[i];
        const long value = bits & mask;
        *rgb++ = red.at(value);
        *rgb++ = green.at(value);
        *rgb++ = blue.at(value);
    }
    return KpResult();
}

unsigned char toByte(double value)
{
    return static_cast<unsigned char>(std::clamp(std::lround(value), 0L, 255L));
}

/// Luminance and two differences to colours, ITU-R BT.601 with the full range.
void fromYbr(unsigned char* pixel)
{
    const double y = pixel[0], blue = pixel[1] - 128.0, red = pixel[2] - 128.0;
    pixel[0] = toByte(y + 1.402 * red);
    pixel[1] = toByte(y - 0.344136 * blue - 0.714136 * red);
    pixel[2] = toByte(y + 1.772 * blue);
}

}  // namespace

KpResult toColours(DcmItem& data, const Image& plane, const std::string& photometric, bool isPlanar,
                   const unsigned char* pixels, unsigned char* rgb)
{
    if (plane.format.isPalette())
        return throughPalette(data, plane, pixels, rgb);
    const bool isYbr = photometric == "YBR_FULL";
    if (photometric != "RGB" && !isYbr)
        return badInput("%s has the unsupported colour model %s", plane.name().c_str(), photometric.c_str());
    const long n = static_cast<long>(plane.rows) * plane.columns;
    for (long i = 0; i < n; ++i) {
        for (long c = 0; c < 3; ++c)
            rgb[3 * i + c] = pixels[isPlanar ? c * n + i : 3 * i + c];
        if (isYbr)
            fromYbr(rgb + 3 * i);
    }
    return KpResult();
}
