#pragma once

#include <kplib/geometry/numerics/KpDMatrix.h>

#include <algorithm>
#include <cmath>

namespace kplib::detail {

// KpDMatrix::pythag(), inline.
inline float pythag(float a, float b)
{
    if (a == 0 && b == 0)
        return 0;
    const float magnitudeA = std::abs(a), magnitudeB = std::abs(b);
    const auto [smaller, greater] = std::minmax(magnitudeA, magnitudeB);  // a NaN is one of the two
    const float ratio = smaller / greater;
    return static_cast<float>(static_cast<double>(greater) * std::sqrt(1.0 + static_cast<double>(ratio * ratio)));
}

// Decomposes the matrix in `u` for KpDMatrix::SVD(), with a square `v` of as many columns:
// Householder reflections to a bidiagonal matrix, then implicit QR sweeps.
bool computeSingularValues(KpDMatrix<float>& u, float* w, KpDMatrix<float>& v, int maxIterations);

}  // namespace kplib::detail
