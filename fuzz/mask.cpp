// Masks of any shape: the fast way and the way of single voxels agree, and a fill stays within what is connected.

#include "Fuzz.h"

#include <kplib/foundation/KpDArray.h>
#include <kplib/geometry/KpVec3i.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/volume/KpBitfield.h>
#include <kplib/volume/KpMorphology.h>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    using Pass = void (*)(const KpBitfield&, KpBitfield&, const KpVec3i&, int, bool);
    static constexpr Pass passes[] = {[](auto& s, auto& d, auto& dims, int n, bool fast) {
                                          KpMorphology::dilation3D(s, d, dims, static_cast<unsigned>(n), fast);
                                      },
                                      [](auto& s, auto& d, auto& dims, int n, bool fast) {
                                          KpMorphology::dilation3D_18(s, d, dims, static_cast<unsigned>(n), fast);
                                      },
                                      [](auto& s, auto& d, auto& dims, int n, bool fast) {
                                          KpMorphology::dilation3D_26(s, d, dims, static_cast<unsigned>(n), fast);
                                      },
                                      KpMorphology::erosion3D,
                                      KpMorphology::erosion3D_18,
                                      KpMorphology::erosion3D_26};
    getTheLogInstance().setLogLevel(KpLogOff);
    Input input(data, size);
    const KpVec3i dims(input.number<std::uint8_t>() % 140, input.number<std::uint8_t>() % 12,
                       input.number<std::uint8_t>() % 6);
    const int n = input.number<std::uint8_t>() % 4;
    const Pass pass = passes[input.number<std::uint8_t>() % 6];
    const KpVec3i seed(input.number<std::int8_t>(), input.number<std::int8_t>(), input.number<std::int8_t>());
    const auto voxels = static_cast<unsigned long>(dims[0] * dims[1] * dims[2]);
    KpBitfield mask(voxels, KpBitfield::INIT_UNSET), fast, plain;
    if (mask.nWords() > 0)
        std::memcpy(mask.data(), input.data(), std::min(input.size(), mask.nWords() * 4));
    pass(mask, fast, dims, n, true);
    pass(mask, plain, dims, n, false);
    for (unsigned long i = 0; i < voxels; ++i)
        check(fast.test(i) == plain.test(i));

    KpBitfield filled(voxels, KpBitfield::INIT_UNSET);
    int box[6];
    KpMorphology::floodfill(mask, filled, KpDArray<KpVec3i>{seed}, true, dims.data(), box);
    for (unsigned long i = 0; i < voxels; ++i)
        check(!filled.test(i) || mask.test(i));
    return 0;
}
