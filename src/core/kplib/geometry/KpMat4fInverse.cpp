#include <kplib/geometry/KpMat4f.h>

#include <kplib/geometry/detail/Mat4fKernels.h>

#include <algorithm>
#include <cmath>
#include <span>
#include <utility>

namespace {

// The reciprocal of a row's largest magnitude; a row of zeros gets a tiny diagonal element first.
float scaleOfRow(float (&row)[4], int i)
{
    if (std::all_of(row, row + 4, [](float element) { return element == 0; }))
        row[i] = 1e-6F;
    float largest = 0;
    for (const float element : row)
        largest = std::max(largest, std::abs(element));
    return 1 / largest;
}

}  // namespace

KpMat4f KpMat4f::inverse() const
{
    KpMat4f result;
    if (isIdentity())
        result.makeIdentity();
    else if (!affine_inverse(*this, result))
        result = inverseByDecomposition();
    return result;
}

KpMat4f KpMat4f::inverseByDecomposition() const
{
    KpMat4f factors = *this, rows = identity();
    int index[4];
    float sign;
    factors.LUDecomposition(index, sign);
    for (auto& row : rows.m_)
        factors.LUBackSubstitution(index, row);
    return rows.transpose();
}

bool KpMat4f::affine_inverse(const KpMat4f& in, KpMat4f& out)
{
    static kplib::detail::AffineInverse* const run = best(kplib::detail::affineInversePaths());
    const auto& m = in.m_;
    const bool isAffine = m[0][3] == 0 && m[1][3] == 0 && m[2][3] == 0 && m[3][3] == 1;
    return isAffine && run(in.data(), out.m_[0]);
}

bool KpMat4f::LUDecomposition(int (&index)[4], float& sign)
{
    float scales[4];
    sign = 1;
    for (int i = 0; i < 4; ++i)
        scales[i] = scaleOfRow(m_[i], i);
    for (int j = 0; j < 4; ++j) {
        float largest = 0;
        int pivot = j;
        for (int i = j; i < 4; ++i) {
            if (const float size = scales[i] * std::abs(m_[i][j]); size >= largest) {
                largest = size;
                pivot = i;
            }
        }
        if (pivot != j) {
            std::swap(m_[pivot], m_[j]);
            sign = -sign;
            scales[pivot] = scales[j];
        }
        index[j] = pivot;
        if (m_[j][j] == 0)
            m_[j][j] = 1e-20F;
        const float reciprocal = 1 / m_[j][j];
        for (int i = j + 1; i < 4; ++i) {
            m_[i][j] *= reciprocal;
            for (int k = j + 1; k < 4; ++k)
                m_[i][k] -= m_[i][j] * m_[j][k];
        }
    }
    return true;
}

void KpMat4f::LUBackSubstitution(const int (&index)[4], float (&b)[4]) const
{
    int first = 4;  // the first element that isn't 0: sums begin there
    for (int i = 0; i < 4; ++i) {
        float sum = std::exchange(b[index[i]], b[i]);
        for (int j = first; j < i; ++j)
            sum -= m_[i][j] * b[j];
        if (first == 4 && sum != 0)
            first = i;
        b[i] = sum;
    }
    for (int i = 3; i >= 0; --i) {
        for (int j = i + 1; j < 4; ++j)
            b[i] -= m_[i][j] * b[j];
        b[i] /= m_[i][i];
    }
}
