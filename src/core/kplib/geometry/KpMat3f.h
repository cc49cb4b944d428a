#pragma once

#include <kplib/foundation/KpCheck.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>

#include <array>
#include <string>

class KpMat4f;

/// A 3x3 matrix of floats, row by row and nothing else, so that the object is its own byte image.
///
/// Points are row vectors that are multiplied by a matrix on their right: a product applies its
/// left factor first. A plain value. A default-constructed matrix is not initialised.
class KPLIB_API KpMat3f {
public:
    constexpr KpMat3f() = default;
    /// From the elements, row by row.
    constexpr KpMat3f(float m00, float m01, float m02, float m10, float m11, float m12, float m20, float m21,
                      float m22) :
        m_{{m00, m01, m02}, {m10, m11, m12}, {m20, m21, m22}}
    {
    }
    /// From three rows.
    explicit KpMat3f(const float (&rows)[3][3]) { setValue(rows); }
    /// From three columns, unlike the overload for an array, which takes rows.
    constexpr KpMat3f(const KpVec3f& column0, const KpVec3f& column1, const KpVec3f& column2) :
        m_{{column0.x(), column1.x(), column2.x()},
           {column0.y(), column1.y(), column2.y()},
           {column0.z(), column1.z(), column2.z()}}
    {
    }
    /// From three rows, unlike the overload for three vectors, which takes columns.
    explicit KpMat3f(const std::array<KpVec3f, 3>& rows) { setValue(rows); }

    /// The identity.
    static constexpr KpMat3f identity() { return {1, 0, 0, 0, 1, 0, 0, 0, 1}; }
    /// Becomes the identity.
    void makeIdentity() { *this = identity(); }
    /// @{
    /// Replaces all elements, given as three rows.
    void setValue(const float (&rows)[3][3]);
    void setValue(const std::array<KpVec3f, 3>& rows);
    /// @}

    /// The upper left of `matrix`.
    void setValue(const KpMat4f& matrix);
    /// Copies the elements, row by row.
    void getValue(float (&rows)[3][3]) const;
    /// As setValue().
    KpMat3f& operator=(const float (&rows)[3][3]);

    /// The three floats of a row; m[row][column].
    constexpr float* operator[](int row)
    {
        KPLIB_CHECK(row >= 0 && row < 3, "KpMat3f: the row is not in [0, 3)");
        return m_[row];
    }
    /// As above.
    constexpr const float* operator[](int row) const
    {
        KPLIB_CHECK(row >= 0 && row < 3, "KpMat3f: the row is not in [0, 3)");
        return m_[row];
    }
    /// The nine floats, row by row.
    constexpr const float* data() const { return m_[0]; }

    /// Becomes this * right.
    KpMat3f& operator*=(const KpMat3f& right) { return *this = *this * right; }
    /// Adds element by element.
    KpMat3f& operator+=(const KpMat3f& other) { return *this = *this + other; }
    /// Scales each element.
    KpMat3f& operator*=(float factor) { return *this = *this * factor; }
    /// Applies `a` first, then `b`.
    friend constexpr KpMat3f operator*(const KpMat3f& a, const KpMat3f& b)
    {
        return fromEach(
            [&](int i, int j) { return a.m_[i][0] * b.m_[0][j] + a.m_[i][1] * b.m_[1][j] + a.m_[i][2] * b.m_[2][j]; });
    }
    /// Element by element.
    friend constexpr KpMat3f operator+(const KpMat3f& a, const KpMat3f& b)
    {
        return fromEach([&](int i, int j) { return a.m_[i][j] + b.m_[i][j]; });
    }
    /// Element by element.
    friend constexpr KpMat3f operator-(const KpMat3f& a, const KpMat3f& b)
    {
        return fromEach([&](int i, int j) { return a.m_[i][j] - b.m_[i][j]; });
    }
    /// @{
    /// Each element scaled.
    friend constexpr KpMat3f operator*(const KpMat3f& m, float factor)
    {
        return fromEach([&](int i, int j) { return m.m_[i][j] * factor; });
    }
    friend constexpr KpMat3f operator*(float factor, const KpMat3f& m) { return m * factor; }
    /// @}

    /// Exact; a matrix that holds a NaN equals none.
    friend constexpr bool operator==(const KpMat3f& a, const KpMat3f& b) = default;
    /// False as soon as one element differs by strictly more than `tolerance`.
    bool equals(const KpMat3f& other, float tolerance) const;

    /// Rows and columns exchanged.
    constexpr KpMat3f transpose() const
    {
        return fromEach([&](int i, int j) { return m_[j][i]; });
    }
    /// The determinant.
    constexpr float det3() const
    {
        return m_[0][0] * cofactor(0, 0) + m_[0][1] * cofactor(0, 1) + m_[0][2] * cofactor(0, 2);
    }

    /// The inverse; of a matrix whose determinant is exactly 0 the adjugate.
    KpMat3f inverse() const;
    /// The adjugate divided by `det`, the determinant if the caller knows it already.
    KpMat3f inverse(float det) const;
    /// The same for a symmetric matrix, of which only the upper half is read.
    KpMat3f symmInverse(float det) const;

    /// The column product: result[i] = sum over j of m[i][j] * v[j]. Input and output may be the
    /// same object.
    void multMatrixVec(const KpVec3f& v, KpVec3f& result) const { result = multMatrixVec(v); }
    /// As above.
    constexpr KpVec3f multMatrixVec(const KpVec3f& v) const
    {
        return {m_[0][0] * v.x() + m_[0][1] * v.y() + m_[0][2] * v.z(),
                m_[1][0] * v.x() + m_[1][1] * v.y() + m_[1][2] * v.z(),
                m_[2][0] * v.x() + m_[2][1] * v.y() + m_[2][2] * v.z()};
    }
    /// The row product, which transforms a point: result[j] = sum over i of v[i] * m[i][j].
    void multVecMatrix(const KpVec3f& v, KpVec3f& result) const { result = multVecMatrix(v); }
    /// As above.
    constexpr KpVec3f multVecMatrix(const KpVec3f& v) const
    {
        return {v.x() * m_[0][0] + v.y() * m_[1][0] + v.z() * m_[2][0],
                v.x() * m_[0][1] + v.y() * m_[1][1] + v.z() * m_[2][1],
                v.x() * m_[0][2] + v.y() * m_[1][2] + v.z() * m_[2][2]};
    }

    /// Computes eigenvalues and eigenvectors of a symmetric matrix by cyclic Jacobi rotations in
    /// single precision. `evectors[j]`, of length 1, belongs to `evalues[j]`; they are not sorted.
    /// `rotations` counts the rotations. If 50 sweeps do not converge, logs one warning and leaves
    /// `evectors` unwritten. Press et al., "Numerical Recipes", 11.1.
    void jacobi(float (&evalues)[3], KpVec3f (&evectors)[3], int& rotations) const;

    /// Decomposes in place: the unit lower factor is below the diagonal, the upper factor on and
    /// above it, with the rows in the order `index`. The pivot of a column is its first element
    /// that is not 0. `parity` is 0 for an even number of exchanges, else 1. Returns false if
    /// column 0 or 1 has no pivot; the last element is not tested.
    bool LUDecomposition(int (&index)[3], float& parity);

    /// {"m00":"1.000000","m01": ... ,"m22":"1.000000"}
    std::string dump() const;

private:
    template <typename Element>
    static constexpr KpMat3f fromEach(Element element)
    {
        return {element(0, 0), element(0, 1), element(0, 2), element(1, 0), element(1, 1),
                element(1, 2), element(2, 0), element(2, 1), element(2, 2)};
    }
    /// The cofactor of element (i, j): the signed determinant without row i and column j.
    constexpr float cofactor(int i, int j) const
    {
        const int r1 = (i + 1) % 3, r2 = (i + 2) % 3, c1 = (j + 1) % 3, c2 = (j + 2) % 3;
        return m_[r1][c1] * m_[r2][c2] - m_[r1][c2] * m_[r2][c1];
    }

    float m_[3][3];
};

static_assert(sizeof(KpMat3f) == 36);
