#include <kplib/numerics/detail/KpSingularValues.h>

#include <kplib/log/KpLogFile.h>

#include <algorithm>
#include <cmath>

namespace kplib::detail {
namespace {

/// Turns columns `p` and `q` against each other.
void rotate(KpDMatrix<float>& matrix, int p, int q, float c, float s)
{
    float* row = matrix.data();
    for (int i = 0; i < matrix.rows(); ++i, row += matrix.cols()) {
        const float a = row[p], b = row[q];
        row[p] = a * c + b * s;
        row[q] = b * c - a * s;
    }
}

/// A reflector that makes a scaled vector with the first element `f` and the sum of squares `s` a multiple g of the
/// first axis; `h` is half the squared length of its normal, negative.
struct Reflector {
    Reflector(float f, float s) : g(-std::copysign(std::sqrt(s), f)), h(f * g - s) {}
    float g, h;
};

}  // namespace

SingularValues::SingularValues(KpDMatrix<float>& u, float* w, KpDMatrix<float>& v) :
    u_(u), w_(w), v_(v), m_(u.rows()), n_(u.cols()), super_(1, n_), rv_(super_.data())
{
}

bool SingularValues::run(int maxIterations)
{
    bidiagonalize();
    accumulateRight();
    accumulateLeft();
    for (int k = n_ - 1; k >= 0; --k) {
        if (!diagonalize(k, maxIterations))
            return false;
    }
    return true;
}

void SingularValues::bidiagonalize()
{
    if (n_ > 0)
        rv_[0] = 0;
    for (int i = 0; i < n_; ++i) {
        reflectColumn(i);
        norm_ = std::max(norm_, std::abs(w_[i]) + std::abs(rv_[i]));
        if (i + 1 < n_)
            reflectRow(i);
    }
}

void SingularValues::reflectColumn(int i)
{
    float scale = 0, squares = 0;
    for (int k = i; k < m_; ++k)
        scale += std::abs(u_[k][i]);
    w_[i] = 0;
    if (scale == 0)
        return;
    for (int k = i; k < m_; ++k) {
        u_[k][i] /= scale;
        squares += u_[k][i] * u_[k][i];
    }
    const Reflector reflector(u_[i][i], squares);
    u_[i][i] -= reflector.g;
    for (int j = i + 1; j < n_; ++j) {
        float sum = 0;
        for (int k = i; k < m_; ++k)
            sum += u_[k][i] * u_[k][j];
        const float factor = sum / reflector.h;
        for (int k = i; k < m_; ++k)
            u_[k][j] += factor * u_[k][i];
    }
    for (int k = i; k < m_; ++k)
        u_[k][i] *= scale;
    w_[i] = scale * reflector.g;
}

void SingularValues::reflectRow(int i)
{
    const int l = i + 1;
    rv_[l] = 0;
    if (i >= m_)
        return;
    float* const row = u_[i];
    float scale = 0, squares = 0;
    for (int k = l; k < n_; ++k)
        scale += std::abs(row[k]);
    if (scale == 0)
        return;
    for (int k = l; k < n_; ++k) {
        row[k] /= scale;
        squares += row[k] * row[k];
    }
    const Reflector reflector(row[l], squares);
    row[l] -= reflector.g;
    for (int k = l; k < n_; ++k)
        rv_[k] = row[k] / reflector.h;
    for (int j = l; j < m_; ++j) {
        float sum = 0;
        for (int k = l; k < n_; ++k)
            sum += u_[j][k] * row[k];
        for (int k = l; k < n_; ++k)
            u_[j][k] += sum * rv_[k];
    }
    for (int k = l; k < n_; ++k)
        row[k] *= scale;
    rv_[l] = scale * reflector.g;
}

void SingularValues::accumulateRight()
{
    for (int i = n_ - 1; i >= 0; --i) {
        const int l = i + 1;
        if (l < n_ && rv_[l] != 0) {
            const float* const row = u_[i];
            for (int j = l; j < n_; ++j)
                v_[j][i] = (row[j] / row[l]) / rv_[l];  // two divisions: their product might underflow
            for (int j = l; j < n_; ++j) {
                float sum = 0;
                for (int k = l; k < n_; ++k)
                    sum += row[k] * v_[k][j];
                for (int k = l; k < n_; ++k)
                    v_[k][j] += sum * v_[k][i];
            }
        }
        for (int j = l; j < n_; ++j)
            v_[i][j] = v_[j][i] = 0;
        v_[i][i] = 1;
    }
}

void SingularValues::accumulateLeft()
{
    for (int i = std::min(m_, n_) - 1; i >= 0; --i) {
        const float inverse = w_[i] == 0 ? 0 : 1 / w_[i];
        std::fill(u_[i] + i + 1, u_[i] + n_, 0.0F);
        for (int j = i + 1; j < n_ && inverse != 0; ++j) {
            float sum = 0;
            for (int k = i + 1; k < m_; ++k)
                sum += u_[k][i] * u_[k][j];
            const float factor = (sum / u_[i][i]) * inverse;
            for (int k = i; k < m_; ++k)
                u_[k][j] += factor * u_[k][i];
        }
        for (int k = i; k < m_; ++k)
            u_[k][i] *= inverse;
        ++u_[i][i];
    }
}

bool SingularValues::diagonalize(int k, int maxIterations)
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
        for (int j = 0; j < n_; ++j)
            v_[j][k] = -v_[j][k];
    }
    return true;
}

int SingularValues::findSplit(int k, bool& cancels) const
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

/// Rotates the superdiagonal element above w[l] away, along the row of the vanished w[l - 1].
void SingularValues::cancel(int l, int k)
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
        rotate(u_, l - 1, i, c, s);
    }
}

/// The first element of the shifted column; the shift is an eigenvalue of the bottom 2x2 minor.
float SingularValues::shift(int l, int k) const
{
    const float x = w_[l], y = w_[k - 1], z = w_[k], g = rv_[k - 1], h = rv_[k];
    const float f = ((y - z) * (y + z) + (g - h) * (g + h)) / (2 * h * y);
    const float root = std::copysign(pythag(f, 1), f);
    return ((x - z) * (x + z) + h * (y / (f + root) - h)) / x;
}

void SingularValues::sweep(int l, int k)
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
        rotate(v_, j, i, c, s);
        w_[j] = turn(f, h);
        f = c * g + s * y;
        x = c * y - s * g;
        rotate(u_, j, i, c, s);
    }
    rv_[l] = 0;
    rv_[k] = f;
    w_[k] = x;
}

}  // namespace kplib::detail
