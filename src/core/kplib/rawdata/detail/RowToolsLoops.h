#pragma once

#include <kplib/cpu/Loose.h>
#include <kplib/rawdata/detail/RowToolsKernels.h>

#include <utility>

namespace kplib::detail {

struct MultiplyAndStore {
    KPLIB_KERNEL_BODY static void run(const float* src, float factor, long long n, float* dst)
    {
        const auto* from = reinterpret_cast<const Loose<float>*>(src);
        auto* to = reinterpret_cast<Loose<float>*>(dst);
        for (long long i = 0; i < n; ++i)
            to[i].value = from[i].value * factor;
    }
};

struct MultiplyAndAdd {
    KPLIB_KERNEL_BODY static void run(const float* src, float factor, long long n, float* dst)
    {
        const auto* from = reinterpret_cast<const Loose<float>*>(src);
        auto* to = reinterpret_cast<Loose<float>*>(dst);
        for (long long i = 0; i < n; ++i)
            to[i].value += from[i].value * factor;
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

KPLIB_X86_ROWS(ScaleLoop, multiplyAndStoreX86);
KPLIB_X86_ROWS(ScaleLoop, multiplyAndAddX86);
KPLIB_X86_ROWS(SwapRowsLoop, swapRowsX86);

}  // namespace kplib::detail
