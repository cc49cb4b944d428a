#pragma once

#include <kplib/foundation/KpCheck.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/geometry/KpVec4f.h>

#include <cstdio>
#include <span>
#include <string>

class KpMat3f;
class KpRotation;

/// A 4x4 matrix of floats, row by row and nothing else, so that the object is its own byte image: an affine or
/// projective transformation of space.
///
/// Points are row vectors that are multiplied by a matrix on their right: a product applies its
/// left factor first. A translation is in the last row. The last column of an affine matrix is (0,
/// 0, 0, 1). A plain value. A default-constructed matrix is not initialised.
class KPLIB_API KpMat4f {
public:
    /// Four floats for element-wise arithmetic, each in the order of a plain loop: one instruction
    /// if the processor has vectors.
    using Row = float __attribute__((vector_size(16)));

    constexpr KpMat4f() = default;
    /// From the elements, row by row.
    constexpr KpMat4f(float m00, float m01, float m02, float m03, float m10, float m11, float m12, float m13, float m20,
                      float m21, float m22, float m23, float m30, float m31, float m32, float m33) :
        m_{{m00, m01, m02, m03}, {m10, m11, m12, m13}, {m20, m21, m22, m23}, {m30, m31, m32, m33}}
    {
    }
    /// From four rows.
    explicit KpMat4f(const float (&rows)[4][4]) { setValue(rows); }
    /// `matrix` in the upper left, 1 in the lower right, else 0.
    explicit KpMat4f(const KpMat3f& matrix);

    /// The identity.
    static constexpr KpMat4f identity() { return {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}; }
    /// Becomes the identity.
    void makeIdentity() { *this = identity(); }
    /// Replaces all elements, given as four rows.
    void setValue(const float (&rows)[4][4]);
    /// The rows (r0, 0), (r1, 0), (r2, 0), (r3, 1).
    void setValue(const KpVec3f& r0, const KpVec3f& r1, const KpVec3f& r2, const KpVec3f& r3)
    {
        const Row rows[] = {{r0.x(), r0.y(), r0.z(), 0},
                            {r1.x(), r1.y(), r1.z(), 0},
                            {r2.x(), r2.y(), r2.z(), 0},
                            {r3.x(), r3.y(), r3.z(), 1}};
        for (int i = 0; i < 4; ++i)
            setRow(i, rows[i]);
    }
    /// Copies the elements, row by row.
    void getValue(float (&rows)[4][4]) const;
    /// As setValue().
    KpMat4f& operator=(const float (&rows)[4][4]);

    /// The matrix of a translation.
    void setTranslate(const KpVec3f& translation)
    {
        setValue(KpVec3f(1, 0, 0), KpVec3f(0, 1, 0), KpVec3f(0, 0, 1), translation);
    }
    /// The matrix of a scale.
    void setScale(float factor) { setScale(KpVec3f(factor, factor, factor)); }
    /// As above, with a factor for each axis.
    void setScale(const KpVec3f& factors);
    /// The matrix of a rotation.
    void setRotate(const KpRotation& rotation);

    /// The four floats of a row; m[row][column].
    constexpr float* operator[](int row)
    {
        KPLIB_CHECK(row >= 0 && row < 4, "KpMat4f: the row is not in [0, 4)");
        return m_[row];
    }
    /// As above.
    constexpr const float* operator[](int row) const
    {
        KPLIB_CHECK(row >= 0 && row < 4, "KpMat4f: the row is not in [0, 4)");
        return m_[row];
    }
    /// The sixteen floats, row by row.
    constexpr const float* data() const { return m_[0]; }

    /// Becomes this * right.
    KpMat4f& operator*=(const KpMat4f& right) { return *this = *this * right; }
    /// Applies `a` first, then `b`.
    friend KpMat4f operator*(const KpMat4f& a, const KpMat4f& b)
    {
        const Row b0 = b.row(0), b1 = b.row(1), b2 = b.row(2), b3 = b.row(3);
        KpMat4f product;
        for (int i = 0; i < 4; ++i)
            product.setRow(i, a.m_[i][0] * b0 + a.m_[i][1] * b1 + a.m_[i][2] * b2 + a.m_[i][3] * b3);
        return product;
    }
    /// Exact; a matrix that holds a NaN equals none.
    friend constexpr bool operator==(const KpMat4f& a, const KpMat4f& b) = default;
    /// False as soon as one element differs by strictly more than `tolerance`.
    bool equals(const KpMat4f& other, float tolerance) const;

    /// Whether no element is NaN.
    bool isNumber() const;
    /// Whether this is exactly the identity.
    constexpr bool isIdentity() const { return *this == identity(); }

    /// Rows and columns exchanged.
    constexpr KpMat4f transpose() const
    {
        return {m_[0][0], m_[1][0], m_[2][0], m_[3][0], m_[0][1], m_[1][1], m_[2][1], m_[3][1],
                m_[0][2], m_[1][2], m_[2][2], m_[3][2], m_[0][3], m_[1][3], m_[2][3], m_[3][3]};
    }
    /// The determinant of the given rows and columns, from 0 to 3.
    float det3(int r1, int r2, int r3, int c1, int c2, int c3) const;
    /// The determinant of the upper left.
    float det3() const { return det3(0, 1, 2, 0, 1, 2); }
    /// The determinant.
    float det4() const;

    /// The inverse, by affine_inverse() if possible, else by LUDecomposition(). A singular matrix
    /// is not an error: its result has large, infinite or NaN elements.
    KpMat4f inverse() const;
    /// Computes the inverse of an affine matrix, with its determinant in double precision. Returns
    /// false and leaves `out` unchanged if the last column is not exactly (0, 0, 0, 1), or if the
    /// determinant is below 1e-15 of the sum of the magnitudes of its terms. If all terms are 0,
    /// returns true with infinities and NaN.
    static bool affine_inverse(const KpMat4f& in, KpMat4f& out);

    /// Decomposes in place by Crout's method with scaled partial pivoting. `index` receives the
    /// pivot rows, `sign` 1 or -1 for an even or odd number of exchanges. Always returns true:
    /// rows of zeros and pivots of 0 are replaced by tiny numbers. Press et al., "Numerical
    /// Recipes", 2.3.
    bool LUDecomposition(int (&index)[4], float& sign);
    /// Solves M x = b in place, where this is the decomposition of M.
    void LUBackSubstitution(const int (&index)[4], float (&b)[4]) const;

    /// The row product, which transforms a point: (v, 1) M divided by its fourth component w. w =
    /// 0 is not checked. Input and output may be the same object.
    void multVecMatrix(const KpVec3f& v, KpVec3f& result) const { result = multVecMatrix(v); }
    /// As above.
    KpVec3f multVecMatrix(const KpVec3f& v) const
    {
        return projected(v.x() * row(0) + v.y() * row(1) + v.z() * row(2) + row(3));
    }
    /// The same for many points, with results equal to the bit. `results` has as many elements as
    /// `points` and may be the same memory.
    void multVecMatrix(std::span<const KpVec3f> points, KpVec3f* results) const;
    /// The column product M (v, 1), divided by its fourth component: the transposed transformation.
    void multMatrixVec(const KpVec3f& v, KpVec3f& result) const { result = multMatrixVec(v); }
    /// As above.
    KpVec3f multMatrixVec(const KpVec3f& v) const
    {
        return projected(v.x() * column(0) + v.y() * column(1) + v.z() * column(2) + column(3));
    }
    /// The row product with the upper left 3x3 part, which transforms a direction: no translation,
    /// no division.
    void multDirMatrix(const KpVec3f& v, KpVec3f& result) const { result = multDirMatrix(v); }
    /// As above.
    KpVec3f multDirMatrix(const KpVec3f& v) const
    {
        const Row sums = v.x() * row(0) + v.y() * row(1) + v.z() * row(2);
        return {sums[0], sums[1], sums[2]};
    }
    /// The products with all four components, without a division.
    void multVecMatrix(const KpVec4f& v, KpVec4f& result) const { result = multVecMatrix(v); }
    /// As above.
    KpVec4f multVecMatrix(const KpVec4f& v) const
    {
        const Row sums = v.x() * row(0) + v.y() * row(1) + v.z() * row(2) + v.w() * row(3);
        return {sums[0], sums[1], sums[2], sums[3]};
    }
    /// The column product with all four components.
    void multMatrixVec(const KpVec4f& v, KpVec4f& result) const { result = multMatrixVec(v); }
    /// As above.
    KpVec4f multMatrixVec(const KpVec4f& v) const
    {
        const Row sums = v.x() * column(0) + v.y() * column(1) + v.z() * column(2) + v.w() * column(3);
        return {sums[0], sums[1], sums[2], sums[3]};
    }

    /// Computes eigenvalues and eigenvectors of the upper left 3x3 part, a symmetric matrix, by
    /// cyclic Jacobi rotations in double precision. Eigenvector j, of length 1, is column j of
    /// `evectors`; they are not sorted. `rotations` grows by 3 a sweep. After 50 sweeps it ends
    /// without a log line. Press et al., "Numerical Recipes", 11.1.
    void jacobi3(float (&evalues)[3], float (&evectors)[3][3], int& rotations) const;

    /// Computes the polar decomposition M = r s r^T u t: scales `s` along the axes of the rotation
    /// `r`, a rotation `u` and a translation `t`; `proj` is the identity. Returns false for a
    /// singular matrix and then writes `t` and `proj` only. Shoemake and Duff, "Matrix animation
    /// and polar decomposition", 1992.
    bool factor(KpMat4f& r, KpVec3f& s, KpMat4f& u, KpVec3f& t, KpMat4f& proj) const;
    /// Computes the arguments of setTransform() for this matrix, by factor(). A singular matrix
    /// gives identity rotations and leaves `scaleFactor` unchanged.
    void getTransform(KpVec3f& translation, KpRotation& rotation, KpVec3f& scaleFactor, KpRotation& scaleOrientation,
                      const KpVec3f& center = KpVec3f(0, 0, 0)) const;
    /// Sets the transformation that translates by -`center`, scales by `scaleFactor` along the
    /// axes of `scaleOrientation`, rotates, and translates by `center` and `translation`, in this
    /// order.
    void setTransform(const KpVec3f& translation, const KpRotation& rotation, const KpVec3f& scaleFactor,
                      const KpRotation& scaleOrientation, const KpVec3f& center = KpVec3f(0, 0, 0));

    /// Writes each row as two lines, the second with one element. Does nothing for null.
    void print(std::FILE* file) const;
    /// {"m00":"1.000000","m01": ... ,"m33":"1.000000"}
    std::string dump() const;

private:
    Row row(int i) const
    {
        Row row;
        __builtin_memcpy(&row, m_[i], sizeof row);
        return row;
    }
    void setRow(int i, Row row) { __builtin_memcpy(m_[i], &row, sizeof row); }
    Row column(int j) const { return Row{m_[0][j], m_[1][j], m_[2][j], m_[3][j]}; }

    /// Divided by the fourth component, by way of its reciprocal.
    static KpVec3f projected(Row point)
    {
        const Row scaled = point * (1 / point[3]);
        return {scaled[0], scaled[1], scaled[2]};
    }

    KpMat4f inverseByDecomposition() const;

    float m_[4][4];
};

static_assert(sizeof(KpMat4f) == 64);
