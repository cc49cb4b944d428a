#include "Operation.h"

#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpString.h>
#include <kplib/volume/KpBitfield.h>
#include <kplib/volume/KpConnectedComponents.h>
#include <kplib/volume/KpMorphology.h>
#include <kplib/volume/KpScanConvert.h>

#include <array>
#include <cmath>
#include <memory>

namespace kplib::probe {

namespace {

constexpr int width = 70, height = 20, depth = 6, voxels = width * height * depth;

KpBitfield mask()
{
    KpBitfield field(voxels, KpBitfield::INIT_UNSET);
    for (unsigned long i = 0; i < voxels; ++i) {
        if (i * i % 7 < 3)
            field.set(i);
    }
    return field;
}

Digest digestOf(const KpBitfield& field)
{
    return Digest().add(field.data(), field.nWords() * sizeof(std::uint32_t));
}

Outcome fields()
{
    KpBitfield field = mask();
    const KpBitfield copy(field);
    field.resize(voxels * 2, KpBitfield::INIT_SET);
    field &= copy;
    KpString text, digest;
    copy.print(text);
    copy.md5(digest);
    return digestOf(field) << text << digest;
}

template <void (*operation)(const KpBitfield&, KpBitfield&, const KpVec3i&, unsigned int, bool)>
Outcome dilated()
{
    const KpBitfield field = mask();
    KpBitfield grown;
    operation(field, grown, {width, height, depth}, 2, true);
    return digestOf(grown);
}

Outcome eroded()
{
    const KpBitfield field = mask();
    KpBitfield shrunk;
    KpMorphology::erosion3D(field, shrunk, {width, height, depth}, 2, true);
    return digestOf(shrunk);
}

Outcome filled()
{
    const KpBitfield field = mask();
    KpBitfield reached;
    KpDArray<KpVec3i> seeds{KpVec3i(0, 0, 0), KpVec3i(40, 10, 3)};
    const int dims[] = {width, height, depth};
    int box[6];
    const unsigned long count = KpMorphology::floodfill(field, reached, seeds, true, dims, box);
    return digestOf(reached) << count << box[1];
}

Outcome components()
{
    std::array<short, voxels> values;
    for (int i = 0; i < voxels; ++i)
        values[static_cast<unsigned long>(i)] = static_cast<short>(i * 37 % 101);
    const int dims[] = {width, height, depth};
    unsigned short* labels = nullptr;
    KpDArray<KpConnectedComponents::Component> table;
    const auto label = [&] {
        return KpConnectedComponents::labelCC({values.data(), KpPrimType::Short}, dims, 6, labels, 0, 80, 90, 0, 0,
                                              &table);
    };
    int count = 0;
    try {
        count = label();
    } catch (...) {
        kpfree(labels);
        throw;
    }
    const std::unique_ptr<unsigned short, KpFree> owner(labels);
    if (count < 0)
        return {};
    return Digest().add(labels, voxels * sizeof *labels) << count << table.size();
}

Outcome converted()
{
    static long pixels;
    pixels = 0;
    std::array<KpVec2f, 600> corners;
    for (unsigned long i = 0; i < corners.size(); ++i) {
        const float angle = static_cast<float>(i) / 600 * 6.2831853F, radius = i % 2 ? 40 : 60;
        corners[i] = KpVec2f(64 + radius * std::cos(angle), 64 + radius * std::sin(angle));
    }
    KpScanConvert convert(0, 0, 127, 127);
    convert.setSpanCB([](void*, int left, int right, int) { pixels += right - left + 1; }, nullptr);
    convert.render(static_cast<int>(corners.size()), corners.data());
    return Digest() << pixels;
}

}  // namespace

Operations volumeOperations()
{
    static constexpr const char* full = "all bits of the target are set if a work area cannot be allocated";
    static constexpr Operation list[] = {
        {"bit fields", fields},
        {"dilation by 6 neighbours", dilated<KpMorphology::dilation3D>, full},
        {"dilation by 18 neighbours", dilated<KpMorphology::dilation3D_18>, full},
        {"dilation by 26 neighbours", dilated<KpMorphology::dilation3D_26>, full},
        {"erosion", eroded, full},
        {"flood fill", filled},
        {"connected components", components},
        {"scan conversion", converted},
    };
    return list;
}

}  // namespace kplib::probe
