#pragma once

#include <kplib/geometry/numerics/detail/LinearSolver.h>

namespace kplib::detail {

KPLIB_X86_ROWS(EliminateLoop, eliminateX86);

struct Eliminate {
    KPLIB_KERNEL_BODY static void run(float* const* lr, int column, int n)
    {
        const float* const pivotRow = lr[column];
        const float reciprocal = 1 / pivotRow[column];
        for (int i = column + 1; i < n; ++i) {
            float* __restrict const row = lr[i];
            const float factor = row[column] * reciprocal;
            row[column] = factor;
            for (int k = column + 1; k < n; ++k)
                row[k] -= factor * pivotRow[k];
        }
    }
};

}  // namespace kplib::detail
