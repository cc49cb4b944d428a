#include <kplib/rawdata/detail/RowToolsKernels.h>

#include <utility>

namespace kplib::detail {
namespace {

struct MultiplyAndStore {
    KPLIB_KERNEL_BODY static void run(const float* src, float factor, long long n, float* dst)
    {
        for (long long i = 0; i < n; ++i)
            dst[i] = src[i] * factor;
    }
};

struct MultiplyAndAdd {
    KPLIB_KERNEL_BODY static void run(const float* src, float factor, long long n, float* dst)
    {
        for (long long i = 0; i < n; ++i)
            dst[i] += src[i] * factor;
    }
};

struct SwapRows {
    KPLIB_KERNEL_BODY static void run(char* rowA, char* rowB, long n)
    {
        char* __restrict a = rowA;
        char* __restrict b = rowB;
        for (long i = 0; i < n; ++i)
            std::swap(a[i], b[i]);
    }
};

}  // namespace

std::span<const KernelPath<ScaleLoop>> multiplyAndStorePaths()
{
    static const KernelPath<ScaleLoop> paths[] = {{"plain", true, ForAny::run<MultiplyAndStore>},
                                                  {"avx2", hasAvx2(), ForAvx2::run<MultiplyAndStore>},
                                                  {"avx512", hasAvx512(), ForAvx512::run<MultiplyAndStore>}};
    return paths;
}

std::span<const KernelPath<ScaleLoop>> multiplyAndAddPaths()
{
    static const KernelPath<ScaleLoop> paths[] = {{"plain", true, ForAny::run<MultiplyAndAdd>},
                                                  {"avx2", hasAvx2(), ForAvx2::run<MultiplyAndAdd>},
                                                  {"avx512", hasAvx512(), ForAvx512::run<MultiplyAndAdd>}};
    return paths;
}

std::span<const KernelPath<SwapRowsLoop>> swapRowsPaths()
{
    static const KernelPath<SwapRowsLoop> paths[] = {{"plain", true, ForAny::run<SwapRows>},
                                                     {"avx2", hasAvx2(), ForAvx2::run<SwapRows>},
                                                     {"avx512", hasAvx512(), ForAvx512::run<SwapRows>}};
    return paths;
}

}  // namespace kplib::detail
