#include <kplib/geometry/KpMat4f.h>

#include <algorithm>
#include <cmath>
#include <utility>

namespace {

/// The reciprocal of a row's largest magnitude; a row of zeros gets a tiny diagonal element first.
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
        return identity();
    if (affine_inverse(*this, result))
        return result;
    KpMat4f factors = *this;
    int index[4];
    float sign;
    factors.LUDecomposition(index, sign);
    result.makeIdentity();
    for (auto& row : result.m_)
        factors.LUBackSubstitution(index, row);
    return result.transpose();
}

bool KpMat4f::affine_inverse(const KpMat4f& in, KpMat4f& out)
{
    const auto& m = in.m_;
    if (m[0][3] != 0 || m[1][3] != 0 || m[2][3] != 0 || m[3][3] != 1)
        return false;

    const double a[3][3] = {{m[0][0], m[0][1], m[0][2]}, {m[1][0], m[1][1], m[1][2]}, {m[2][0], m[2][1], m[2][2]}};
    double positive = 0, negative = 0;
    for (const double term : {a[0][0] * a[1][1] * a[2][2], a[0][1] * a[1][2] * a[2][0], a[0][2] * a[1][0] * a[2][1],
                              -a[0][2] * a[1][1] * a[2][0], -a[0][1] * a[1][0] * a[2][2], -a[0][0] * a[1][2] * a[2][1]})
        (term >= 0 ? positive : negative) += term;
    const double det = positive + negative;
    if (std::abs(det / (positive - negative)) < 1e-15)
        return false;

    const double scale = 1 / det;
    const auto element = [&](int i, int j) {
        const int r1 = (j + 1) % 3, r2 = (j + 2) % 3, c1 = (i + 1) % 3, c2 = (i + 2) % 3;
        return static_cast<float>((a[r1][c1] * a[r2][c2] - a[r1][c2] * a[r2][c1]) * scale);
    };
    const KpVec3f r0(element(0, 0), element(0, 1), element(0, 2));
    const KpVec3f r1(element(1, 0), element(1, 1), element(1, 2));
    const KpVec3f r2(element(2, 0), element(2, 1), element(2, 2));
    out.setValue(r0, r1, r2, -(m[3][0] * r0 + m[3][1] * r1 + m[3][2] * r2));
    return true;
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
        for (int i = 0; i < 4; ++i) {
            for (int k = 0; k < std::min(i, j); ++k)
                m_[i][j] -= m_[i][k] * m_[k][j];
            if (const float size = scales[i] * std::abs(m_[i][j]); i >= j && size >= largest) {
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
        for (int i = j + 1; i < 4; ++i)
            m_[i][j] *= reciprocal;
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
