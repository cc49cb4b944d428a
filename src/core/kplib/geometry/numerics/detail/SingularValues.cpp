#include <kplib/geometry/numerics/detail/SingularValues.h>

#include <kplib/log/KpLogFile.h>

#include <algorithm>
#include <cmath>

// Plan
//
// The singular value decomposition of Golub and Reinsch, "Singular value decomposition and least
// squares solutions", Numerische Mathematik 14, 1970, in floats and in the memory of U, w and V.
//
//     x x x  reflections  w r .  rotations  w . .
//     x x x  ---------->  . w r  -------->  . w .
//     x x x               . . w             . . w
//     x x x               . . .             . . .
//
// bidiagonalize(): reflection i clears column i below the diagonal, then row i right of the
// superdiagonal. w_ receives the diagonal, rv_ the superdiagonal (rv_[i] is above w_[i], rv_[0] is
// 0). The normal of each reflection stays in its column or row of `u`.
//
// accumulateRight() and accumulateLeft() multiply the reflections to V and, in place, to U.
//
// diagonalize(k), from the last value to the first: QR sweeps with an implicit shift over the part
// from l to k make rv_[k] smaller until it vanishes. findSplit() starts the part at the last l
// where rv_[l] or w_[l - 1] vanishes; in the second case cancel() first rotates rv_[l] away. A
// value vanishes if it does not change norm_, the largest |w_[i]| + |rv_[i]|, when added to it.

namespace kplib::detail {
namespace {

// `magnitude` with the sign of `value`. Both zeros count as positive, since the sign of a zero
// depends on roundings of earlier steps.
float withSignOf(float value, float magnitude)
{
    return value >= 0 ? magnitude : -magnitude;
}

// A reflector that maps a scaled vector with the first element `f` and the sum of squares `s` to
// `g` times the first axis; -2 h is the squared length of its normal.
struct Reflector {
    Reflector(float f, float s) : g(-withSignOf(f, std::sqrt(s))), h(f * g - s) {}
    float g, h;
};

// Decomposes the matrix in `u`. `Fixed` is the number of its rows and columns if that is known at
// compile time, or 0.
template <int Fixed>
class SingularValues {
public:
    SingularValues(KpDMatrix<float>& u, float* w, KpDMatrix<float>& v) :
        u_(u.data()), w_(w), v_(v.data()), m_(u.rows()), n_(u.cols())
    {
        if (n_ > small)
            large_.resize(1, n_);
        rv_ = n_ > small ? large_.data() : small_;
    }
    SingularValues(const SingularValues&) = delete;
    SingularValues& operator=(const SingularValues&) = delete;

    bool run(int maxIterations)
    {
        bidiagonalize();
        accumulateRight();
        accumulateLeft();
        for (int k = n() - 1; k >= 0; --k) {
            if (!diagonalize(k, maxIterations))
                return false;
        }
        return true;
    }

private:
    static constexpr int small = 8;  // up to this number of columns no memory is allocated

    int m() const { return Fixed ? Fixed : m_; }
    int n() const { return Fixed ? Fixed : n_; }
    float* u(int row) const { return u_ + static_cast<std::ptrdiff_t>(row) * n(); }
    float* v(int row) const { return v_ + static_cast<std::ptrdiff_t>(row) * n(); }
    bool vanishes(float value) const { return std::abs(value) + norm_ == norm_; }

    // Rotates columns `p` and `q`.
    void rotate(float* row, int rows, int p, int q, float c, float s) const
    {
        for (int i = 0; i < rows; ++i, row += n()) {
            const float a = row[p], b = row[q];
            row[p] = a * c + b * s;
            row[q] = b * c - a * s;
        }
    }

    void bidiagonalize()
    {
        if (n() > 0)
            rv_[0] = 0;
        for (int i = 0; i < n(); ++i) {
            reflectColumn(i);
            norm_ = std::max(norm_, std::abs(w_[i]) + std::abs(rv_[i]));
            if (i + 1 < n())
                reflectRow(i);
        }
    }

    void reflectColumn(int i)
    {
        float scale = 0, squares = 0;
        for (int k = i; k < m(); ++k)
            scale += std::abs(u(k)[i]);
        w_[i] = 0;
        if (scale == 0)
            return;
        if (i + 1 == m()) {  // the reflector of one element changes a sign: the same, and no root
            for (int j = i + 1; j < n(); ++j)
                u(i)[j] = -u(i)[j];
            w_[i] = -u(i)[i];
            u(i)[i] *= 2;
            return;
        }
        for (int k = i; k < m(); ++k) {
            u(k)[i] /= scale;
            squares += u(k)[i] * u(k)[i];
        }
        const Reflector reflector(u(i)[i], squares);
        u(i)[i] -= reflector.g;
        for (int j = i + 1; j < n(); ++j) {
            float sum = 0;
            for (int k = i; k < m(); ++k)
                sum += u(k)[i] * u(k)[j];
            const float factor = sum / reflector.h;
            for (int k = i; k < m(); ++k)
                u(k)[j] += factor * u(k)[i];
        }
        for (int k = i; k < m(); ++k)
            u(k)[i] *= scale;
        w_[i] = scale * reflector.g;
    }

    void reflectRow(int i)
    {
        const int l = i + 1;
        rv_[l] = 0;
        if (i >= m())
            return;
        float* const row = u(i);
        float scale = 0, squares = 0;
        for (int k = l; k < n(); ++k)
            scale += std::abs(row[k]);
        if (scale == 0)
            return;
        if (l + 1 == n()) {
            for (int j = l; j < m(); ++j)
                u(j)[l] = -u(j)[l];
            rv_[l] = -row[l];
            row[l] *= 2;
            return;
        }
        for (int k = l; k < n(); ++k) {
            row[k] /= scale;
            squares += row[k] * row[k];
        }
        const Reflector reflector(row[l], squares);
        row[l] -= reflector.g;
        for (int k = l; k < n(); ++k)
            rv_[k] = row[k] / reflector.h;
        for (int j = l; j < m(); ++j) {
            float sum = 0;
            for (int k = l; k < n(); ++k)
                sum += u(j)[k] * row[k];
            for (int k = l; k < n(); ++k)
                u(j)[k] += sum * rv_[k];
        }
        for (int k = l; k < n(); ++k)
            row[k] *= scale;
        rv_[l] = scale * reflector.g;
    }

    void accumulateRight()
    {
        for (int i = n() - 1; i >= 0; --i) {
            const int l = i + 1;
            if (l < n() && rv_[l] != 0) {
                const float* const row = u(i);
                for (int j = l; j < n(); ++j)
                    v(j)[i] = (row[j] / row[l]) / rv_[l];  // two divisions: their product might underflow
                for (int j = l; j < n(); ++j) {
                    float sum = 0;
                    for (int k = l; k < n(); ++k)
                        sum += row[k] * v(k)[j];
                    for (int k = l; k < n(); ++k)
                        v(k)[j] += sum * v(k)[i];
                }
            }
            for (int j = l; j < n(); ++j)
                v(i)[j] = v(j)[i] = 0;
            v(i)[i] = 1;
        }
    }

    void accumulateLeft()
    {
        for (int i = std::min(m(), n()) - 1; i >= 0; --i) {
            const float inverse = w_[i] == 0 ? 0 : 1 / w_[i];
            for (int j = i + 1; j < n(); ++j)
                u(i)[j] = 0;
            for (int j = i + 1; j < n() && inverse != 0; ++j) {
                float sum = 0;
                for (int k = i + 1; k < m(); ++k)
                    sum += u(k)[i] * u(k)[j];
                const float factor = (sum / u(i)[i]) * inverse;
                for (int k = i; k < m(); ++k)
                    u(k)[j] += factor * u(k)[i];
            }
            for (int k = i; k < m(); ++k)
                u(k)[i] *= inverse;
            ++u(i)[i];
        }
    }

    bool diagonalize(int k, int maxIterations)
    {
        for (int counter = 1;; ++counter) {
            bool cancels = false;
            const int l = findSplit(k, cancels);
            if (cancels)
                cancel(l, k);
            if (l == k)
                break;
            if (counter >= maxIterations) {
                getTheLogInstance().warnf("no convergence in %d svd iterations \n", maxIterations);
                return false;
            }
            sweep(l, k);
        }
        if (w_[k] < 0) {
            w_[k] = -w_[k];
            for (int j = 0; j < n(); ++j)
                v(j)[k] = -v(j)[k];
        }
        return true;
    }

    int findSplit(int k, bool& cancels) const
    {
        for (int l = k; l > 0; --l) {
            if (vanishes(rv_[l]))
                return l;
            cancels = vanishes(w_[l - 1]);
            if (cancels)
                return l;
        }
        return 0;  // there is nothing above the first value
    }

    // Rotates the superdiagonal element above w[l] away, along the row of the vanished w[l - 1].
    void cancel(int l, int k)
    {
        float c = 0, s = 1;
        for (int i = l; i <= k; ++i) {
            const float f = s * rv_[i];
            rv_[i] *= c;
            if (vanishes(f))
                break;
            const float g = w_[i];
            w_[i] = pythag(f, g);
            c = g / w_[i];
            s = -f / w_[i];
            rotate(u_, m(), l - 1, i, c, s);
        }
    }

    // The first element of the shifted column; the shift is an eigenvalue of the bottom 2x2 minor.
    float shift(int l, int k) const
    {
        const float x = w_[l], y = w_[k - 1], z = w_[k], g = rv_[k - 1], h = rv_[k];
        const float f = ((y - z) * (y + z) + (g - h) * (g + h)) / (2 * h * y);
        const float root = withSignOf(f, pythag(f, 1));
        return ((x - z) * (x + z) + h * (y / (f + root) - h)) / x;
    }

    void sweep(int l, int k)
    {
        float f = shift(l, k), x = w_[l], c = 1, s = 1;
        const auto turn = [&c, &s](float a, float b) {
            const float norm = pythag(a, b);
            if (norm != 0) {
                c = a / norm;
                s = b / norm;
            }
            return norm;
        };
        for (int j = l; j < k; ++j) {
            const int i = j + 1;
            float g = c * rv_[i], h = s * rv_[i], y = w_[i];
            rv_[j] = turn(f, h);
            f = x * c + g * s;
            g = g * c - x * s;
            h = y * s;
            y *= c;
            rotate(v_, n(), j, i, c, s);
            w_[j] = turn(f, h);
            f = c * g + s * y;
            x = c * y - s * g;
            rotate(u_, m(), j, i, c, s);
        }
        rv_[l] = 0;
        rv_[k] = f;
        w_[k] = x;
    }

    float* u_;
    float* w_;
    float* v_;
    int m_, n_;
    float norm_ = 0;
    float small_[small];
    KpDMatrix<float> large_;
    float* rv_;  // the superdiagonal in one of the two, element i above w[i]
};

}  // namespace

bool computeSingularValues(KpDMatrix<float>& u, float* w, KpDMatrix<float>& v, int maxIterations)
{
    if (u.rows() == 3 && u.cols() == 3)
        return SingularValues<3>(u, w, v).run(maxIterations);
    return SingularValues<0>(u, w, v).run(maxIterations);
}

}  // namespace kplib::detail
