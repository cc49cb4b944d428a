#pragma once

#include <kplib/geometry/KpMat4f.h>

/// A matrix and its inverse, for code that applies both many times. The inverse is computed when
/// the matrix is set.
class KpMat4fCache {
public:
    /// The identity.
    KpMat4fCache() = default;
    /// Of that matrix.
    explicit KpMat4fCache(const KpMat4f& matrix) { setMatrix(matrix); }

    /// Replaces the matrix and computes its inverse.
    void setMatrix(const KpMat4f& matrix)
    {
        matrix_ = matrix;
        inverse_ = matrix_.inverse();
    }
    /// The matrix.
    const KpMat4f& getMatrix() const { return matrix_; }
    /// Its inverse.
    const KpMat4f& getInvMatrix() const { return inverse_; }

private:
    KpMat4f matrix_ = KpMat4f::identity();
    KpMat4f inverse_ = KpMat4f::identity();
};

static_assert(sizeof(KpMat4fCache) == 128);
