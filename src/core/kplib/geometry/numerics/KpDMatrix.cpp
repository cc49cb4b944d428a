#include <kplib/geometry/numerics/KpDMatrix.h>

#include <kplib/foundation/KpCheck.h>
#include <kplib/foundation/KpMemory.h>
#include <kplib/geometry/numerics/detail/LinearSolver.h>
#include <kplib/geometry/numerics/detail/SingularValues.h>
#include <kplib/log/KpLogFile.h>

#include <algorithm>
#include <utility>

template <typename T>
KpDMatrix<T>::~KpDMatrix()
{
    kpfree(data_);
}

template <typename T>
KpDMatrix<T>& KpDMatrix<T>::operator=(const KpDMatrix& other)
{
    if (this == &other)
        return *this;
    resize(other.rows_, other.cols_);
    std::copy_n(other.data_, place(rows_), data_);
    return *this;
}

template <typename T>
void KpDMatrix<T>::swap(KpDMatrix& other) noexcept
{
    std::swap(rows_, other.rows_);
    std::swap(cols_, other.cols_);
    std::swap(data_, other.data_);
}

template <typename T>
void KpDMatrix<T>::resize(int rows, int cols)
{
    KPLIB_CHECK(rows >= 0 && cols >= 0, "KpDMatrix: a count of rows or columns is negative");
    if (rows == rows_ && cols == cols_)
        return;
    const std::size_t count = static_cast<std::size_t>(rows) * static_cast<std::size_t>(cols);
    if (count > 0) {
        data_ = static_cast<T*>(kprealloc(data_, count * sizeof(T)));
    } else {
        kpfree(data_);
        data_ = nullptr;
    }
    rows_ = rows;
    cols_ = cols;
}

template <typename T>
void KpDMatrix<T>::transpose()
{
    KpDMatrix result(cols_, rows_);
    for (int i = 0; i < rows_; ++i) {
        for (int j = 0; j < cols_; ++j)
            result[j][i] = (*this)[i][j];
    }
    swap(result);
}

template <typename T>
KpDMatrix<T>& KpDMatrix<T>::operator*=(const KpDMatrix& other)
{
    if (cols_ != other.rows_) {
        getTheLogInstance().errorf("KpDMatrix:operator*: Can not multiply %dx%d matrix by %dx%d matrix.\n", rows_,
                                   cols_, other.rows_, other.cols_);
        return *this;
    }
    KpDMatrix product(rows_, other.cols_);
    std::fill_n(product.data_, product.place(product.rows_), T(0));
    for (int i = 0; i < rows_; ++i) {
        T* const sums = product[i];
        for (int k = 0; k < cols_; ++k) {  // outside the columns: the order of each sum stays, and rows are contiguous
            const T factor = (*this)[i][k];
            const T* const right = other[k];
            for (int j = 0; j < other.cols_; ++j)
                sums[j] += factor * right[j];
        }
    }
    swap(product);
    return *this;
}

template <typename T>
bool KpDMatrix<T>::SVD(KpDMatrix& U, T* w, KpDMatrix& V, int maxIterations) const
{
    KPLIB_CHECK(&U != this && &V != this && &U != &V, "KpDMatrix: SVD needs three different matrices");
    U = *this;
    V.resize(cols_, cols_);
    return kplib::detail::computeSingularValues(U, w, V, maxIterations);
}

template <typename T>
int KpDMatrix<T>::solveLRdecomp(T** rhs, int count) const
{
    kplib::detail::SolverRows rows(rows_);
    T sign = 1;
    return rows.allocate() ? solveLRdecomp(rows.get(), rhs, count, sign) : 1;
}

template <typename T>
int KpDMatrix<T>::solveLRdecomp(T** lr, T** rhs, int count, T& sign) const
{
    if (rows_ != cols_) {
        getTheLogInstance().warnf("KpDMatrix::solveLRdecomp: must be a square matrix.\n");
        return 1;
    }
    for (int i = 0; i < rows_; ++i)
        std::copy_n((*this)[i], cols_, lr[i]);
    sign = 1;
    if (rows_ == 0)
        return 0;
    kplib::detail::LinearSolver solver(data_, rows_, lr);
    if (!solver.isComplete() || !solver.decompose(sign))
        return 1;
    for (int i = 0; i < count; ++i)
        solver.solve(rhs[i]);
    return 0;
}

template <typename T>
T KpDMatrix<T>::pythag(T a, T b)
{
    return kplib::detail::pythag(a, b);
}

template class KpDMatrix<float>;
