#include <kplib/rawdata/TmSSETools.h>

#include <kplib/rawdata/detail/RowToolsKernels.h>

#include <algorithm>
#include <cstring>
#include <span>

using namespace kplib::detail;

float* TmSSETools::multiplyAndStoreUnaligned(float* src, float factor, long long n, float* dst)
{
    static ScaleLoop* const run = best(multiplyAndStorePaths());
    run(src, factor, n, dst);
    return dst + n;
}

float* TmSSETools::multiplyAndAddUnaligned(float* src, float factor, long long n, float* dst)
{
    static ScaleLoop* const run = best(multiplyAndAddPaths());
    run(src, factor, n, dst);
    return dst + n;
}

void TmSSETools::mirrorY(char* data, long rows, long rowBytes)
{
    static SwapRowsLoop* const swapRows = best(swapRowsPaths());
    if (rowBytes < 1)
        return;
    for (long low = 0, high = rows - 1; low < high; ++low, --high)
        swapRows(data + low * rowBytes, data + high * rowBytes, rowBytes);
}

void TmSSETools::memcpyMirrorY(const unsigned char* src, long rows, long srcRowBytes, unsigned char* dst,
                               long dstRowBytes)
{
    if (srcRowBytes < 1 || dstRowBytes < 1)
        return;
    const auto bytes = static_cast<std::size_t>(std::min(srcRowBytes, dstRowBytes));
    for (long i = 0; i < rows; ++i)
        std::memcpy(dst + (rows - 1 - i) * dstRowBytes, src + i * srcRowBytes, bytes);
}
