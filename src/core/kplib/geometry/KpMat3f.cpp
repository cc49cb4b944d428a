#include <kplib/geometry/KpMat3f.h>

#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/detail/MatrixElements.h>

#include <algorithm>
#include <utility>

void KpMat3f::setValue(const float (&rows)[3][3])
{
    *this = fromEach([&](int i, int j) { return rows[i][j]; });
}

void KpMat3f::setValue(const std::array<KpVec3f, 3>& rows)
{
    *this = fromEach([&](int i, int j) { return rows[static_cast<std::size_t>(i)][j]; });
}

void KpMat3f::setValue(const KpMat4f& matrix)
{
    *this = fromEach([&](int i, int j) { return matrix[i][j]; });
}

void KpMat3f::getValue(float (&rows)[3][3]) const
{
    std::copy_n(m_[0], 9, rows[0]);
}

KpMat3f& KpMat3f::operator=(const float (&rows)[3][3])
{
    setValue(rows);
    return *this;
}

bool KpMat3f::equals(const KpMat3f& other, float tolerance) const
{
    return kplib::detail::elementsEqual<9>(data(), other.data(), tolerance);
}

KpMat3f KpMat3f::inverse() const
{
    const float det = det3();
    return inverse(det == 0 ? 1 : det);
}

KpMat3f KpMat3f::inverse(float det) const
{
    return fromEach([&](int i, int j) { return cofactor(j, i) / det; });
}

KpMat3f KpMat3f::symmInverse(float det) const
{
    const float xx = (m_[1][1] * m_[2][2] - m_[1][2] * m_[1][2]) / det;
    const float xy = (m_[1][2] * m_[0][2] - m_[0][1] * m_[2][2]) / det;
    const float xz = (m_[0][1] * m_[1][2] - m_[1][1] * m_[0][2]) / det;
    const float yy = (m_[0][0] * m_[2][2] - m_[0][2] * m_[0][2]) / det;
    const float yz = (m_[0][1] * m_[0][2] - m_[0][0] * m_[1][2]) / det;
    const float zz = (m_[0][0] * m_[1][1] - m_[0][1] * m_[0][1]) / det;
    return {xx, xy, xz, xy, yy, yz, xz, yz, zz};
}

bool KpMat3f::LUDecomposition(int (&index)[3], float& parity)
{
    for (int i = 0; i < 3; ++i)
        index[i] = i;
    parity = 0;
    for (int column = 0; column < 2; ++column) {
        int pivot = column;
        while (pivot < 3 && m_[pivot][column] == 0)
            ++pivot;
        if (pivot == 3)
            return false;
        if (pivot != column) {
            std::swap(m_[pivot], m_[column]);
            std::swap(index[pivot], index[column]);
            parity = 1 - parity;
        }
        for (int row = column + 1; row < 3; ++row) {
            m_[row][column] /= m_[column][column];
            for (int j = column + 1; j < 3; ++j)
                m_[row][j] -= m_[row][column] * m_[column][j];
        }
    }
    return true;
}

std::string KpMat3f::dump() const
{
    return kplib::detail::dumpElements<3>(data());
}
