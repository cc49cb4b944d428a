#pragma once

#include <kplib/foundation/KpCheck.h>
#include <kplib/foundation/KpExport.h>

#include <cstddef>

/// A dense matrix of any size, row by row, with the linear algebra that the 3x3 and 4x4 types
/// cannot do. float is the only element type.
///
/// Each matrix owns its block: copies are deep. An empty matrix has no block. Unless stated
/// otherwise, exhausted memory throws KpMemoryException and leaves the matrix unchanged. No shared
/// state; one thread at a time.
template <typename T>
class KpDMatrix {
public:
    /// Type of the elements.
    using value_type = T;

    KpDMatrix() noexcept = default;
    /// The elements are not initialised.
    KpDMatrix(int rows, int cols) { resize(rows, cols); }
    /// Copies the elements.
    KpDMatrix(const KpDMatrix& other) { *this = other; }
    /// Takes the block; `other` is left empty.
    KpDMatrix(KpDMatrix&& other) noexcept { swap(other); }
    ~KpDMatrix();

    /// Copies shape and elements.
    KpDMatrix& operator=(const KpDMatrix& other);
    /// Takes the block of `other`.
    KpDMatrix& operator=(KpDMatrix&& other) noexcept
    {
        KpDMatrix(static_cast<KpDMatrix&&>(other)).swap(*this);
        return *this;
    }
    /// Exchanges the blocks.
    void swap(KpDMatrix& other) noexcept;

    /// Changes the shape. Does nothing if the shape is the same. Otherwise the elements keep their
    /// places in memory, not their rows and columns, and new ones are not initialised. Counts must
    /// not be negative.
    void resize(int rows, int cols);

    /// Number of rows.
    int rows() const noexcept { return rows_; }
    /// Number of columns.
    int cols() const noexcept { return cols_; }
    /// Element [i][j] is at i * cols() + j; null for an empty matrix.
    T* data() noexcept { return data_; }
    /// As above.
    const T* data() const noexcept { return data_; }
    /// The elements of a row; m[row][column], not checked.
    T* operator[](int row) noexcept
    {
        KPLIB_CHECK(row >= 0 && row < rows_, "KpDMatrix: the row is not in [0, rows())");
        return data_ + place(row);
    }
    /// As above.
    const T* operator[](int row) const noexcept
    {
        KPLIB_CHECK(row >= 0 && row < rows_, "KpDMatrix: the row is not in [0, rows())");
        return data_ + place(row);
    }

    /// Exchanges rows and columns, by way of a new block.
    void transpose();

    /// Replaces this by the product this * other; each element is summed from the first column on
    /// in the precision of T. If the shapes do not match, logs one error and leaves this
    /// unchanged.
    KpDMatrix& operator*=(const KpDMatrix& other);

    /// The singular values of this m by n matrix A: A = U diag(w) transpose(V), with U m by n and
    /// V n by n, whose columns are orthonormal (those of U that belong to a row that A doesn't
    /// have are 0). `w`: place for n values, none negative, in no order. False, with one warning
    /// in the log and the three left unfinished, if a value has not converged when its
    /// `maxIterations`-th iteration begins; 30 suffices. U and V are neither this nor each other.
    /// O(m n^2). Golub and Reinsch, "Singular value decomposition and least squares solutions",
    /// Numerische Mathematik 14, 1970.
    bool SVD(KpDMatrix& U, T* w, KpDMatrix& V, int maxIterations) const;

    /// Solves A x = b in place for each of the `count` right-hand sides `rhs`, of n elements each.
    /// A is this n by n matrix and is unchanged. Returns 0 on success. Returns 1, with a warning
    /// or errors in the log and the sides unchanged, if the matrix is not square or singular, or
    /// if memory is exhausted. Solutions are refined until the residual is 1e-5 of the side; a
    /// solution with a residual above 1e-4 is kept, with a warning. O(n^3).
    int solveLRdecomp(T** rhs, int count) const;
    /// The same with room from the caller: `lr` are n rows of n elements and receive the factors, with rows exchanged;
    /// `sign` is 1 or -1 for an even or odd number of exchanges. Gaussian elimination with partial pivoting and
    /// iterative refinement: Golub and Van Loan, "Matrix Computations", 3.4 and 3.5.
    int solveLRdecomp(T** lr, T** rhs, int count, T& sign) const;

    /// sqrt(a * a + b * b) without overflow on the way, the root in double precision.
    static T pythag(T a, T b);

private:
    std::size_t place(int row) const { return static_cast<std::size_t>(row) * static_cast<std::size_t>(cols_); }

    int rows_ = 0;
    int cols_ = 0;
    T* data_ = nullptr;
};

extern template class KPLIB_API KpDMatrix<float>;
