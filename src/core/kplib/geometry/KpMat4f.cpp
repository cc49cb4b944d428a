#include <kplib/geometry/KpMat4f.h>

#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/detail/MatrixElements.h>

#include <algorithm>
#include <cmath>

KpMat4f::KpMat4f(const KpMat3f& matrix)
{
    setValue(KpVec3f(matrix[0][0], matrix[0][1], matrix[0][2]), KpVec3f(matrix[1][0], matrix[1][1], matrix[1][2]),
             KpVec3f(matrix[2][0], matrix[2][1], matrix[2][2]), KpVec3f(0, 0, 0));
}

void KpMat4f::setValue(const float (&rows)[4][4])
{
    std::copy_n(rows[0], 16, m_[0]);
}

void KpMat4f::getValue(float (&rows)[4][4]) const
{
    std::copy_n(m_[0], 16, rows[0]);
}

KpMat4f& KpMat4f::operator=(const float (&rows)[4][4])
{
    setValue(rows);
    return *this;
}

void KpMat4f::setScale(const KpVec3f& factors)
{
    setValue(KpVec3f(factors.x(), 0, 0), KpVec3f(0, factors.y(), 0), KpVec3f(0, 0, factors.z()), KpVec3f(0, 0, 0));
}

bool KpMat4f::equals(const KpMat4f& other, float tolerance) const
{
    return kplib::detail::elementsEqual<16>(data(), other.data(), tolerance);
}

bool KpMat4f::isNumber() const
{
    return std::none_of(data(), data() + 16, [](float element) { return std::isnan(element); });
}

float KpMat4f::det3(int r1, int r2, int r3, int c1, int c2, int c3) const
{
    return m_[r1][c1] * (m_[r2][c2] * m_[r3][c3] - m_[r2][c3] * m_[r3][c2]) +
           m_[r1][c2] * (m_[r2][c3] * m_[r3][c1] - m_[r2][c1] * m_[r3][c3]) +
           m_[r1][c3] * (m_[r2][c1] * m_[r3][c2] - m_[r2][c2] * m_[r3][c1]);
}

float KpMat4f::det4() const
{
    return m_[1][3] * det3(0, 2, 3, 0, 1, 2) - m_[0][3] * det3(1, 2, 3, 0, 1, 2) - m_[2][3] * det3(0, 1, 3, 0, 1, 2) +
           m_[3][3] * det3(0, 1, 2, 0, 1, 2);
}

void KpMat4f::print(std::FILE* file) const
{
    if (file == nullptr)
        return;
    for (int i = 0; i < 16; ++i)
        std::fprintf(file, "%10.5g%c", static_cast<double>(data()[i]), i % 4 < 2 ? '\t' : '\n');
}

std::string KpMat4f::dump() const
{
    return kplib::detail::dumpElements<4>(data());
}
