#include "Mosaic.h"

#include "FrameValues.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <string>

namespace {

constexpr const char* csaCreator = "SIEMENS CSA HEADER";
constexpr const char* headerCreator = "SIEMENS MR HEADER";

/// A table of named lists of texts, little endian:
///
///     "SV10" 4 bytes, number of elements, 77, then for each element
///     name[64], count, VR[4], 4 bytes, number of items, 77, then for each item
///     4 words of which the first is the length, the text, padding to 4 bytes
///
/// An older form starts with the number of elements and keeps the length plus the first item's length; it is not read.
class CsaTable {
public:
    CsaTable(const Uint8* bytes, unsigned long size) : bytes_(bytes), size_(size) {}

    /// The texts of an element; empty if it is missing or the table is damaged.
    std::vector<std::string> find(const char* name)
    {
        at_ = 8;
        if (size_ < 16 || std::memcmp(bytes_, "SV10", 4) != 0)
            return {};
        const Uint32 elements = word();
        at_ += 4;
        for (Uint32 i = 0; i < elements && at_ + 84 <= size_; ++i) {
            const auto* const found = reinterpret_cast<const char*>(bytes_ + at_);
            const std::string here(found, strnlen(found, 64));
            at_ += 76;
            const Uint32 items = word();
            at_ += 4;
            std::vector<std::string> texts = itemsOf(items);
            if (here == name)
                return texts;
        }
        return {};
    }

private:
    Uint32 word()
    {
        Uint32 value = 0;
        if (at_ + 4 <= size_)
            std::memcpy(&value, bytes_ + at_, 4);
        at_ += 4;
        return value;
    }
    std::vector<std::string> itemsOf(Uint32 count)
    {
        std::vector<std::string> texts;
        for (Uint32 i = 0; i < count && at_ + 16 <= size_; ++i) {
            const Uint32 length = word();
            at_ += 12;
            if (length > size_ - std::min(at_, size_))
                break;
            const auto* const text = reinterpret_cast<const char*>(bytes_ + at_);
            if (length > 0)
                texts.emplace_back(text, strnlen(text, length));
            at_ += (length + 3UL) / 4 * 4;
        }
        return texts;
    }

    const Uint8* bytes_;
    unsigned long size_, at_ = 0;
};

struct Layout {
    int slices = 0;
    std::optional<KpVec3d> normal;
};

Layout layoutOf(DcmItem& data)
{
    Layout layout;
    double number = 0;
    if (DcmElement* const element = findPrivate(data, 0x0019, headerCreator, 0x0a);
        element && realOf(*element, 0, number))
        layout.slices = static_cast<int>(number);
    DcmElement* const header = findPrivate(data, 0x0029, csaCreator, 0x10);
    Uint8* bytes = nullptr;
    if (!header || header->getUint8Array(bytes).bad() || !bytes)
        return layout;
    CsaTable table(bytes, header->getLength());
    if (const auto texts = table.find("NumberOfImagesInMosaic"); layout.slices == 0 && !texts.empty())
        layout.slices = std::atoi(texts.front().c_str());
    const auto texts = table.find("SliceNormalVector");
    if (texts.size() >= 3)
        layout.normal = KpVec3d(std::atof(texts[0].c_str()), std::atof(texts[1].c_str()), std::atof(texts[2].c_str()));
    return layout;
}

}  // namespace

std::vector<Image> unfolded(const Image& image, DcmItem& data)
{
    if (image.trait(Trait::ImageType).find("MOSAIC") == std::string::npos)
        return {image};
    const Layout layout = layoutOf(data);
    const int across = static_cast<int>(std::ceil(std::sqrt(static_cast<double>(layout.slices))));
    Image first = image;
    const KpVec3d normal = layout.normal.value_or(KpVec3d(0, 0, 0));
    const double step = image.sliceSpacing > 0 ? image.sliceSpacing : image.thickness;
    const bool isAlongNormal = std::abs(std::abs(normal.dot(image.normal())) - 1) < 1e-3;
    if (layout.slices < 1 || image.rows % across != 0 || image.columns % across != 0 || !isAlongNormal ||
        !image.hasPlace || step == 0) {
        first.problem = "it is a mosaic, and its private header does not say how many slices it has and where";
        return {first};
    }
    first.rows /= across;
    first.columns /= across;
    first.tilesAcross = across;
    // The position is that of a plane as large as the mosaic around the same middle.
    first.position += image.rowAxis * ((image.columns - first.columns) / 2.0 * image.columnSpacing) +
                      image.columnAxis * ((image.rows - first.rows) / 2.0 * image.rowSpacing);
    const KpVec3d direction = image.normal() * (normal.dot(image.normal()) < 0 ? -1.0 : 1.0);
    std::vector<Image> slices(static_cast<size_t>(layout.slices), first);
    for (int i = 0; i < layout.slices; ++i) {
        slices[static_cast<size_t>(i)].tile = i;
        slices[static_cast<size_t>(i)].position += direction * (step * i);
    }
    return slices;
}
