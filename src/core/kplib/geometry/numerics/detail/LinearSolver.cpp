#include <kplib/geometry/numerics/detail/LinearSolver.h>

#include <kplib/geometry/numerics/detail/EliminateLoop.h>
#include <kplib/log/KpLogFile.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <initializer_list>
#include <numeric>
#include <utility>

namespace kplib::detail {
namespace {

constexpr int maxRounds = 10;

template <typename T>
T* allocated(int count)
{
    return static_cast<T*>(std::malloc(static_cast<std::size_t>(count) * sizeof(T)));
}

void logExhausted()
{
    getTheLogInstance().errorf("KpDMatrix::solveLRdecomp: Not Enough Memory.\n");
}

double norm(const float* values, int n)
{
    double sum = 0;
    for (int i = 0; i < n; ++i)
        sum += static_cast<double>(values[i]) * static_cast<double>(values[i]);
    return std::sqrt(sum);
}

// Each addition waits for the one before, so several rows are summed side by side, each in its own
// order.
constexpr int together = 4;

// Subtracts from each of `count` sums the products of a row with `x`, from column `begin` toward `end` in steps of 1
// or -1.
template <int Step, typename RowAt>
void subtractProducts(RowAt rowAt, int count, const float* x, int begin, int end, float* sums)
{
    if (count == together) {
        const float *const r0 = rowAt(0), *const r1 = rowAt(1), *const r2 = rowAt(2), *const r3 = rowAt(3);
        float s0 = sums[0], s1 = sums[1], s2 = sums[2], s3 = sums[3];
        for (int k = begin; k != end; k += Step) {
            s0 -= r0[k] * x[k];
            s1 -= r1[k] * x[k];
            s2 -= r2[k] * x[k];
            s3 -= r3[k] * x[k];
        }
        const float all[together] = {s0, s1, s2, s3};
        std::copy_n(all, together, sums);
        return;
    }
    for (int r = 0; r < count; ++r) {
        for (int k = begin; k != end; k += Step)
            sums[r] -= rowAt(r)[k] * x[k];
    }
}

}  // namespace

std::span<const KernelPath<EliminateLoop>> eliminatePaths()
{
    static const KernelTable<EliminateLoop> paths({{"plain", true, ForAny::run<Eliminate>}}, eliminateX86());
    return paths;
}

bool SolverRows::allocate()
{
    rows_.reset(allocated<float*>(n_));
    if (!rows_) {
        logExhausted();
        return false;
    }
    for (; count_ < n_; ++count_) {
        float*& row = rows_.get()[count_];
        row = allocated<float>(n_);
        if (!row) {
            getTheLogInstance().errorf("KpDMatrix::solveLRdecomp: Not Enough Memory (%d).\n", count_);
            return false;
        }
    }
    return true;
}

SolverRows::~SolverRows()
{
    for (int i = 0; i < count_; ++i)
        std::free(rows_.get()[i]);
}

LinearSolver::LinearSolver(const float* a, int n, float** lr) :
    a_(a), n_(n), lr_(lr), work_(allocated<float>(4 * n)), permutation_(allocated<int>(n))
{
    if (!isComplete()) {
        logExhausted();
        return;
    }
    b_ = work_.get();
    residual_ = b_ + n;
    x_ = residual_ + n;
    correction_ = x_ + n;
    std::iota(permutation_.get(), permutation_.get() + n, 0);
}

bool LinearSolver::decompose(float& sign)
{
    static EliminateLoop* const eliminate = best(eliminatePaths());
    for (int column = 0; column < n_; ++column) {
        const int pivot = pivotOf(column);
        if (pivot != column) {
            std::swap_ranges(lr_[pivot], lr_[pivot] + n_, lr_[column]);
            std::swap(permutation_.get()[pivot], permutation_.get()[column]);
            sign = -sign;
        }
        if (lr_[column][column] == 0) {
            getTheLogInstance().errorf("KpDMatrix::solveLRdecomp: Singular Matrix-2\n");
            getTheLogInstance().errorf("i, n: %d %d\n", column, n_);
            return false;
        }
        eliminate(lr_, column, n_);
    }
    return true;
}

// The row from `column` on with the greatest magnitude in it, the last of equals.
int LinearSolver::pivotOf(int column) const
{
    int pivot = column;
    for (int i = column + 1; i < n_; ++i) {
        if (std::abs(lr_[i][column]) >= std::abs(lr_[pivot][column]))
            pivot = i;
    }
    return pivot;
}

void LinearSolver::solve(float* side)
{
    std::copy_n(side, n_, b_);
    std::copy_n(side, n_, residual_);
    std::fill_n(x_, n_, 0.0F);
    const double r0 = norm(b_, n_), limit = r0 * 1e-5;
    double r = r0;
    for (int round = 0; round < maxRounds && r > limit; ++round) {
        correct();
        r = computeResidual();
    }
    if (r0 > 0 && r / r0 > 0.0001)
        getTheLogInstance().warnf("norm(residuum) / norm(rhs) = %g \n", r / r0);
    std::copy_n(x_, n_, side);
}

// Adds the solution for the residual to the solution.
void LinearSolver::correct()
{
    float* const y = correction_;
    for (int i = 0; i < n_; ++i)
        y[i] = residual_[permutation_.get()[i]];
    for (int i = 0; i < n_; i += together) {
        const int count = std::min(together, n_ - i);
        subtractProducts<1>([&](int r) { return lr_[i + r]; }, count, y, 0, i, y + i);
        for (int r = 1; r < count; ++r)
            subtractProducts<1>([&](int) { return lr_[i + r]; }, 1, y, i, i + r, y + i + r);
    }
    for (int end = n_; end > 0; end -= together) {
        const int i = std::max(end - together, 0);
        subtractProducts<-1>([&](int r) { return lr_[i + r]; }, end - i, y, n_ - 1, end - 1, y + i);
        for (int row = end - 1; row >= i; --row) {
            subtractProducts<-1>([&](int) { return lr_[row]; }, 1, y, end - 1, row, y + row);
            y[row] /= lr_[row][row];
        }
    }
    for (int i = 0; i < n_; ++i)
        x_[i] += y[i];
}

// b - A x, and its norm.
double LinearSolver::computeResidual()
{
    std::copy_n(b_, n_, residual_);
    for (int i = 0; i < n_; i += together) {
        const float* const rows = a_ + static_cast<std::size_t>(i) * static_cast<std::size_t>(n_);
        subtractProducts<1>([&](int r) { return rows + static_cast<std::size_t>(r) * static_cast<std::size_t>(n_); },
                            std::min(together, n_ - i), x_, 0, n_, residual_ + i);
    }
    return norm(residual_, n_);
}

}  // namespace kplib::detail
