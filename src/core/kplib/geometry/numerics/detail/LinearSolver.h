#pragma once

#include <kplib/cpu/KernelPath.h>
#include <kplib/foundation/KpMemory.h>

#include <memory>
#include <span>

namespace kplib::detail {

// Room for the factors of an n by n matrix, one block a row.
class SolverRows {
public:
    explicit SolverRows(int n) : n_(n) {}
    SolverRows(const SolverRows&) = delete;
    SolverRows& operator=(const SolverRows&) = delete;
    ~SolverRows();

    // False, with an error in the log, if memory is exhausted; the blocks allocated so far are
    // freed with the object.
    bool allocate();
    float** get() const { return rows_.get(); }

private:
    int n_;
    int count_ = 0;  // of rows that there is memory for
    std::unique_ptr<float*[], KpFree> rows_;
};

// Solves for KpDMatrix::solveLRdecomp() with the `n` by `n` matrix `a`, of which `lr` holds a
// copy.
class LinearSolver {
public:
    // Logs it as an error when the memory is exhausted.
    LinearSolver(const float* a, int n, float** lr);

    bool isComplete() const { return work_ && permutation_; }
    // False, and logged, for a singular matrix; negates `sign` at each exchange of rows.
    bool decompose(float& sign);
    // Replaces `side` by the solution for it.
    void solve(float* side);

private:
    int pivotOf(int column) const;
    void correct();
    double computeResidual();

    const float* a_;
    int n_;
    float** lr_;
    std::unique_ptr<float[], KpFree> work_;
    std::unique_ptr<int[], KpFree> permutation_;  // the row of `a` that each row of `lr` holds
    float *b_ = nullptr, *residual_ = nullptr, *x_ = nullptr, *correction_ = nullptr;  // within work_
};

// One step of the elimination: the factors of `column` in the rows below it, and what they leave of the lower right.
using EliminateLoop = void(float* const* lr, int column, int n);

std::span<const KernelPath<EliminateLoop>> eliminatePaths();

}  // namespace kplib::detail
