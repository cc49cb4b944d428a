#include "StoredValues.h"

#include <cstdint>
#include <type_traits>

namespace {

/// The stored bits as a number: cut out, and with their sign.
template <typename Word>
Word cutOut(Word from, const PixelFormat& format)
{
    const int unused = static_cast<int>(sizeof(Word)) * 8 - format.bitsStored;
    const int below = format.highBit + 1 - format.bitsStored;
    const Word bits = static_cast<Word>(static_cast<Word>(from >> below) << unused);
    using Signed = std::make_signed_t<Word>;
    return format.isSigned ? static_cast<Word>(static_cast<Signed>(bits) >> unused) : static_cast<Word>(bits >> unused);
}

/// The columns and rows of a frame that a plane covers.
struct Region2D {
    long left, top, columns, rows, frameColumns;

    explicit Region2D(const Image& plane) : columns(plane.columns), rows(plane.rows)
    {
        frameColumns = columns * plane.tilesAcross;
        left = plane.tile < 0 ? 0 : plane.tile % plane.tilesAcross * columns;
        top = plane.tile < 0 ? 0 : plane.tile / plane.tilesAcross * rows;
    }
};

template <typename Word, typename Stored>
void copyWords(const unsigned char* pixels, const Image& plane, Stored* to)
{
    const Region2D region(plane);
    for (long y = 0; y < region.rows; ++y) {
        const auto* const row =
            reinterpret_cast<const Word*>(pixels) + (region.top + y) * region.frameColumns + region.left;
        for (long x = 0; x < region.columns; ++x) {
            const Word bits = cutOut(row[x], plane.format);
            *to++ = plane.format.isSigned ? static_cast<Stored>(static_cast<std::make_signed_t<Word>>(bits))
                                          : static_cast<Stored>(bits);
        }
    }
}

}  // namespace

void copyValues(const unsigned char* pixels, const Image& plane, void* stored)
{
    const PixelFormat& format = plane.format;
    switch (format.bitsAllocated) {
    case 16:
        if (format.isSigned)
            copyWords<std::uint16_t>(pixels, plane, static_cast<short*>(stored));
        else
            copyWords<std::uint16_t>(pixels, plane, static_cast<unsigned short*>(stored));
        break;
    case 32:
        if (format.isSigned)
            copyWords<std::uint32_t>(pixels, plane, static_cast<int*>(stored));
        else
            copyWords<std::uint32_t>(pixels, plane, static_cast<double*>(stored));
        break;
    default:
        if (format.isSigned)
            copyWords<std::uint8_t>(pixels, plane, static_cast<short*>(stored));
        else
            copyWords<std::uint8_t>(pixels, plane, static_cast<unsigned char*>(stored));
    }
}

KpPrimType storedType(const PixelFormat& format)
{
    if (format.isColour())
        return KpPrimType::Byte;
    switch (format.bitsAllocated) {
    case 16:
        return format.isSigned ? KpPrimType::Short : KpPrimType::UShort;
    case 32:
        return format.isSigned ? KpPrimType::Int : KpPrimType::Double;
    default:
        return format.isSigned ? KpPrimType::Short : KpPrimType::Byte;
    }
}
