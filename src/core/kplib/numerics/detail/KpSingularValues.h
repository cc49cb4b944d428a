#pragma once

#include <kplib/numerics/KpDMatrix.h>

#include <algorithm>
#include <cmath>
#include <memory>

namespace kplib::detail {

/// KpDMatrix::pythag(), where the compiler sees it.
inline float pythag(float a, float b)
{
    if (a == 0 && b == 0)
        return 0;
    const float magnitudeA = std::abs(a), magnitudeB = std::abs(b);
    const float greater = std::max(magnitudeA, magnitudeB);
    const float ratio = std::min(magnitudeA, magnitudeB) / greater;
    return static_cast<float>(greater * std::sqrt(1.0 + static_cast<double>(ratio * ratio)));
}

/// The work of KpDMatrix::SVD(): Householder reflections to a bidiagonal matrix, then implicit QR sweeps.
class SingularValues {
public:
    /// `u` comes as the matrix itself.
    SingularValues(KpDMatrix<float>& u, float* w, KpDMatrix<float>& v);

    bool run(int maxIterations);

private:
    void bidiagonalize();
    void reflectColumn(int i);
    void reflectRow(int i);
    void accumulateRight();
    void accumulateLeft();
    bool diagonalize(int k, int maxIterations);
    int findSplit(int k, bool& cancels) const;
    void cancel(int l, int k);
    float shift(int l, int k) const;
    void sweep(int l, int k);
    bool vanishes(float value) const { return std::abs(value) + norm_ == norm_; }

    KpDMatrix<float>& u_;
    float* w_;
    KpDMatrix<float>& v_;
    int m_, n_;
    float norm_ = 0;
    KpDMatrix<float> super_;  // one row: the superdiagonal, element i above w[i]
    float* rv_;
};

}  // namespace kplib::detail
