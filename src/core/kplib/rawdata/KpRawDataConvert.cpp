#include <kplib/rawdata/KpRawData.h>

#include <kplib/cpu/Blockwise.h>
#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

#include <cstring>
#include <span>

namespace {

using namespace kplib::detail;

// Returns whether both types are numbers. Intentional: if the target is not a number, an error is
// logged; if only the source is not, nothing is logged.
bool areNumbers(KpPrimType to, KpPrimType from)
{
    if (!to.isNumber()) {
        getTheLogInstance().errorf("Unsupported data type %s in KpRawData()\n", to.name());
        return false;
    }
    return from.isNumber();
}

void mapNumbers(KpTypedPointer dst, KpTypedPointer src, unsigned long n, double offset, double scale)
{
    static MapLoops* const loops = best(mapPaths());
    MapLoop* const loop = loops(dst.type, src.type);
    transfer({dst.data, src.data, static_cast<long>(n), dst.type.size(), src.type.size()},
             [=](void* to, const void* from, long count) { loop(to, from, count, offset, scale); });
}

}  // namespace

void KpRawData::memcpy(KpTypedPointer dst, KpTypedPointer src, long n)
{
    static ConvertLoops* const loops = best(convertPaths());
    if (dst.type == src.type) {
        if (n > 0)
            std::memmove(dst.data, src.data, static_cast<unsigned long>(n) * static_cast<unsigned>(dst.type.size()));
        return;
    }
    if (dst.type == KpPrimType::Complex || src.type == KpPrimType::Complex) {
        getTheLogInstance().errorf("ERROR: KpRawData::memcpy(), complex data are not supported\n");
        return;
    }
    if (areNumbers(dst.type, src.type) && n > 0)
        transfer({dst.data, src.data, n, dst.type.size(), src.type.size()}, loops(dst.type, src.type));
}

void KpRawData::mapLinear(KpTypedPointer dst, KpTypedPointer src, unsigned long n, double offset, double scale)
{
    if (dst.type == KpPrimType::Complex && src.type == KpPrimType::Complex) {
        mapNumbers({dst.data, KpPrimType::Float}, {src.data, KpPrimType::Float}, 2 * n, offset, scale);
        return;
    }
    if (dst.type == KpPrimType::Complex || src.type == KpPrimType::Complex) {
        // Intentional: one text for both directions.
        getTheLogInstance().errorf("ERROR: KpRawData::mapLinear(), mapping from complex to real is not supported\n");
        return;
    }
    if (areNumbers(dst.type, src.type))
        mapNumbers(dst, src, n, offset, scale);
}
