#include <kplib/geometry/KpRotation.h>

#include <kplib/geometry/KpMat4f.h>

#include <algorithm>
#include <cmath>
#include <numbers>

namespace {

KpVec3f normalized(KpVec3f v)
{
    v.normalize();
    return v;
}

double root(float x)
{
    return std::sqrt(static_cast<double>(x));
}

}  // namespace

KpRotation KpRotation::withAxis(const KpVec3f& unit, double sine, double cosine)
{
    const auto times = [sine](float component) { return static_cast<float>(static_cast<double>(component) * sine); };
    return asStored(times(unit.x()), times(unit.y()), times(unit.z()), static_cast<float>(cosine));
}

void KpRotation::setValue(float x, float y, float z, float w)
{
    *this = asStored(x, y, z, w);
    normalize();
}

void KpRotation::setValue(const KpVec3f& axis, float angle)
{
    const KpVec3f unit = normalized(axis);
    const double half = static_cast<double>(angle) / 2;
    *this = withAxis(unit, std::sin(half), std::cos(half));
}

void KpRotation::setValue(const KpMat4f& matrix)
{
    setFromRows(matrix[0], matrix[1], matrix[2], matrix[3][3]);
}

void KpRotation::setValue(const KpMat3f& matrix)
{
    setFromRows(matrix[0], matrix[1], matrix[2], 1);
}

void KpRotation::setFromRows(const float* row0, const float* row1, const float* row2, float corner)
{
    const float* const m[] = {row0, row1, row2};
    const int i = m[0][0] > m[1][1] ? (m[0][0] > m[2][2] ? 0 : 2) : (m[1][1] > m[2][2] ? 1 : 2);
    const int j = (i + 1) % 3, k = (i + 2) % 3;
    const float trace = m[0][0] + m[1][1] + m[2][2];
    float divisor;
    if (trace > m[i][i]) {
        q_[3] = static_cast<float>(root(trace + corner) / 2);
        divisor = 4 * q_[3];
        q_[0] = (m[1][2] - m[2][1]) / divisor;
        q_[1] = (m[2][0] - m[0][2]) / divisor;
        q_[2] = (m[0][1] - m[1][0]) / divisor;
    } else {
        q_[i] = static_cast<float>(root(m[i][i] - m[j][j] - m[k][k] + corner) / 2);
        divisor = 4 * q_[i];
        q_[j] = (m[i][j] + m[j][i]) / divisor;
        q_[k] = (m[i][k] + m[k][i]) / divisor;
        q_[3] = (m[j][k] - m[k][j]) / divisor;
    }
}

void KpRotation::setValue(const KpVec3f& from, const KpVec3f& to)
{
    const KpVec3f unitFrom = normalized(from);
    const float cosine = unitFrom.dot(normalized(to));
    if (cosine >= 1) {
        *this = identity();
    } else if (cosine <= -1) {
        KpVec3f axis = unitFrom.cross(KpVec3f(1, 0, 0));
        if (axis.squaredLength() == 0)
            axis = unitFrom.cross(KpVec3f(0, 1, 0));
        *this = withAxis(normalized(axis), 1, 0);
    } else {
        *this = withAxis(normalized(from.cross(to)), root((1 - cosine) / 2), root((1 + cosine) / 2));
    }
}

void KpRotation::setValue(const KpVec3f& from1, const KpVec3f& from2, const KpVec3f& to1, const KpVec3f& to2)
{
    const KpRotation first(from1, to1);
    const KpVec3f turned = first.multVec(from2);
    auto angle = static_cast<float>(std::acos(static_cast<double>(std::clamp(turned.dot(to2), -1.0F, 1.0F))));
    if (turned.cross(to2).dot(to1) < 0)
        angle = 2 * std::numbers::pi_v<float> - angle;
    *this = first * KpRotation(to1, angle);
}

void KpRotation::getValue(float& x, float& y, float& z, float& w) const
{
    x = q_[0];
    y = q_[1];
    z = q_[2];
    w = q_[3];
}

void KpRotation::getValue(KpVec3f& axis, float& angle) const
{
    const KpVec3f vector(q_[0], q_[1], q_[2]);
    const float length = vector.length();
    const bool turns = static_cast<double>(length) > 1e-5;
    axis = turns ? vector / length : KpVec3f(0, 0, 1);
    const float cosine = std::clamp(q_[3], -1.0F, 1.0F);  // a product of small turns may be slightly greater than 1
    angle = turns ? static_cast<float>(2 * std::acos(static_cast<double>(cosine))) : 0;
}

void KpRotation::getValue(KpMat4f& matrix) const
{
    matrix = KpMat4f(toMat3f());
}

void KpMat4f::setRotate(const KpRotation& rotation)
{
    rotation.getValue(*this);
}

KpMat3f KpRotation::toMat3f() const
{
    const auto& [x, y, z, w] = q_;
    const auto diagonal = [](float p, float q) {
        const auto a = static_cast<double>(p), b = static_cast<double>(q);
        return static_cast<float>(1 - 2 * (a * a + b * b));
    };
    return {diagonal(y, z),      2 * (x * y + z * w), 2 * (z * x - y * w), 2 * (x * y - z * w), diagonal(x, z),
            2 * (x * w + y * z), 2 * (y * w + z * x), 2 * (y * z - x * w), diagonal(x, y)};
}

void KpRotation::normalize()
{
    const double length = root(norm());
    for (float& component : q_)
        component = static_cast<float>(static_cast<double>(component) / length);
}

void KpRotation::invert()
{
    const float n = norm();
    *this = asStored(-q_[0] / n, -q_[1] / n, -q_[2] / n, q_[3] / n);
}

void KpRotation::scaleAngle(float factor)
{
    KpVec3f axis;
    float angle;
    getValue(axis, angle);
    setValue(axis, angle * factor);
}

KpRotation& KpRotation::operator*=(const KpRotation& r)
{
    const auto& [x1, y1, z1, w1] = q_;
    const auto& [x2, y2, z2, w2] = r.q_;
    setValue(w2 * x1 + x2 * w1 + y2 * z1 - z2 * y1, w2 * y1 + y2 * w1 + z2 * x1 - x2 * z1,
             w2 * z1 + z2 * w1 + x2 * y1 - y2 * x1, w2 * w1 - x2 * x1 - y2 * y1 - z2 * z1);
    return *this;
}

bool KpRotation::equals(const KpRotation& other, float tolerance) const
{
    bool same = true, opposite = true;
    for (int i = 0; i < 4; ++i) {
        same = same && std::abs(q_[i] - other.q_[i]) < tolerance;
        opposite = opposite && std::abs(q_[i] + other.q_[i]) < tolerance;
    }
    return same || opposite;
}

KpVec3f KpRotation::multVec(const KpVec3f& v) const
{
    KpMat4f matrix;
    getValue(matrix);
    return matrix.multVecMatrix(v);
}

KpRotation KpRotation::slerp(const KpRotation& a, const KpRotation& b, float t)
{
    const float product = a.q_[0] * b.q_[0] + a.q_[1] * b.q_[1] + a.q_[2] * b.q_[2] + a.q_[3] * b.q_[3];
    const float cosine = std::abs(product);
    double scaleB = static_cast<double>(t), scaleA = 1 - scaleB;
    if (static_cast<double>(1 - cosine) > 1e-5) {
        const double omega = std::acos(static_cast<double>(cosine));
        scaleA = std::sin(scaleA * omega) / std::sin(omega);
        scaleB = std::sin(scaleB * omega) / std::sin(omega);
    }
    if (product < 0)  // the shorter way leads to the negative of b
        scaleB = -scaleB;
    KpRotation result;
    for (int i = 0; i < 4; ++i)
        result.q_[i] =
            static_cast<float>(scaleA * static_cast<double>(a.q_[i]) + scaleB * static_cast<double>(b.q_[i]));
    return result;
}
