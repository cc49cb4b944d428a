#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/KpVec3f.h>

class KpMat4f;

/// A rotation in space: the quaternion x, y, z, w with w the scalar part, four floats and nothing else, so that the
/// object is its own byte image.
///
/// Products are ordered as those of matrices: a * b applies a first. A positive angle about +z
/// turns +x toward +y. A plain value. A default-constructed rotation is not initialised.
class KPLIB_API KpRotation {
public:
    constexpr KpRotation() = default;
    // Each constructor does what setValue() does with the same arguments.
    /// @{
    /// As setValue().
    KpRotation(float x, float y, float z, float w) { setValue(x, y, z, w); }
    explicit KpRotation(const float* xyzw) { setValue(xyzw); }
    KpRotation(const KpVec3f& axis, float angle) { setValue(axis, angle); }
    explicit KpRotation(const KpMat4f& matrix) { setValue(matrix); }
    explicit KpRotation(const KpMat3f& matrix) { setValue(matrix); }
    KpRotation(const KpVec3f& from, const KpVec3f& to) { setValue(from, to); }
    KpRotation(const KpVec3f& from1, const KpVec3f& from2, const KpVec3f& to1, const KpVec3f& to2)
    {
        setValue(from1, from2, to1, to2);
    }
    /// @}

    /// The rotation by 0.
    static constexpr KpRotation identity() { return asStored(0, 0, 0, 1); }

    /// Sets the four components, normalised. Four zeros are not checked.
    void setValue(float x, float y, float z, float w);
    /// As above, from four floats.
    void setValue(const float* xyzw) { setValue(xyzw[0], xyzw[1], xyzw[2], xyzw[3]); }
    /// Sets the rotation by `angle` (radians) about `axis`, of any length but 0.
    void setValue(const KpVec3f& axis, float angle);
    /// Sets the rotation of a matrix, whose upper left must be a rotation. The result is not
    /// normalised. Shoemake, "Animating rotation with quaternion curves", 1985.
    void setValue(const KpMat4f& matrix);
    /// As above.
    void setValue(const KpMat3f& matrix);
    /// Sets the smallest rotation that maps the direction `from` to the direction `to`.
    ///
    /// If the directions are exactly opposite and the dot product of the normalised directions is
    /// -1, the result is a half turn about an axis orthogonal to them. For about a third of all
    /// directions rounding makes the dot product greater than -1. The result is then the
    /// quaternion (0, 0, 0, w) with w below 0.001, whose matrix is the identity. Check for
    /// opposite directions first.
    void setValue(const KpVec3f& from, const KpVec3f& to);
    /// Sets the rotation that maps `from1` to `to1`, and `from2` as near to `to2` as possible, for
    /// pairs that are orthogonal. All four have length 1.
    void setValue(const KpVec3f& from1, const KpVec3f& from2, const KpVec3f& to1, const KpVec3f& to2);

    /// The four as stored.
    void getValue(float& x, float& y, float& z, float& w) const;
    /// Axis of length 1 and angle in radians; (0, 0, 1) and 0 where there is nearly no turn.
    void getValue(KpVec3f& axis, float& angle) const;
    /// @{
    /// The matrix of toMat3f(), in a KpMat4f as its upper left.
    void getValue(KpMat4f& matrix) const;
    void getValue(KpMat3f& matrix) const { matrix = toMat3f(); }
    /// @}

    /// The matrix for row vectors; the diagonal in double precision, rounded to float.
    KpMat3f toMat3f() const;

    /// Component `i` in the order x, y, z, w; not checked.
    constexpr float operator[](int i) const { return q_[i]; }
    /// x, y, z, w
    constexpr const float* data() const { return q_; }

    /// Divides by the square root of norm(). The root is computed in double precision.
    void normalize();
    /// The sum of the four squares; no root is taken.
    float norm() const { return q_[0] * q_[0] + q_[1] * q_[1] + q_[2] * q_[2] + q_[3] * q_[3]; }
    /// Replaces this rotation by its inverse, also if it is not normalised: the product of both is
    /// the identity.
    void invert();
    /// The inverse rotation, as by invert().
    KpRotation inverse() const
    {
        KpRotation result = *this;
        result.invert();
        return result;
    }
    /// Multiplies the angle.
    void scaleAngle(float factor);

    /// This * r, then normalised.
    KpRotation& operator*=(const KpRotation& r);
    /// Applies `a` first, then `b`; not normalised.
    friend constexpr KpRotation operator*(const KpRotation& a, const KpRotation& b)
    {
        const auto& [x1, y1, z1, w1] = a.q_;
        const auto& [x2, y2, z2, w2] = b.q_;
        const float p = (x1 + y1) * (x2 + z2);
        const float q = (x1 - y1) * (x2 - z2);
        const float r = (w1 - z1) * (w2 + y2);
        const float s = (w1 + z1) * (w2 - y2);
        return asStored((w1 + x1) * (w2 + x2) - (p + q + r + s) / 2, (p - q + r - s) / 2 - (y1 + z1) * (x2 - w2),
                        (p - q - r + s) / 2 - (x1 - w1) * (z2 + y2), (r + s - p - q) / 2 + (y1 - z1) * (z2 - y2));
    }
    /// Exact; q and -q, the same rotation, differ.
    friend constexpr bool operator==(const KpRotation& a, const KpRotation& b) = default;
    /// Whether the four, or their negatives, differ by strictly less than `tolerance`.
    bool equals(const KpRotation& other, float tolerance) const;

    /// Rotates `v`, by toMat3f(). Input and output may be the same object.
    void multVec(const KpVec3f& v, KpVec3f& result) const { result = multVec(v); }
    /// As above.
    KpVec3f multVec(const KpVec3f& v) const;
    /// As multVec().
    KpVec3f operator*(const KpVec3f& v) const { return multVec(v); }

    /// Interpolates from `a` at t = 0 to `b` (or its negative) at t = 1 at a constant speed along
    /// the shorter way. The result is not normalised. Shoemake, "Animating rotation with
    /// quaternion curves", 1985.
    static KpRotation slerp(const KpRotation& a, const KpRotation& b, float t);

private:
    static constexpr KpRotation asStored(float x, float y, float z, float w)
    {
        KpRotation rotation;
        rotation.q_[0] = x;
        rotation.q_[1] = y;
        rotation.q_[2] = z;
        rotation.q_[3] = w;
        return rotation;
    }
    static KpRotation withAxis(const KpVec3f& unit, double sine, double cosine);
    /// From the rows of a matrix, of which the first three are read; `corner` is its last element.
    void setFromRows(const float* row0, const float* row1, const float* row2, float corner);

    float q_[4];
};

static_assert(sizeof(KpRotation) == 16);
