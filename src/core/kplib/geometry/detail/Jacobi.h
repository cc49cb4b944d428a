#pragma once

#include <cmath>

namespace kplib::detail {

// Cyclic Jacobi rotations of a symmetric 3x3 matrix, of which the upper half is read. `Real` is what the work is done
// in; eigenvalues and eigenvectors are floats at each step, whatever it is.
//
// Everything is indexed by constants once run() is unrolled, so that it stays in registers.
template <typename Real>
class Jacobi {
public:
    float evalues[3];
    float evectors[3][3] = {{1, 0, 0}, {0, 1, 0}, {0, 0, 1}};  // one a column
    int rotations = 0;
    int sweeps = 0;

    // Small elements are not rotated while the sweep is below `thresholdSweeps`; from `skipSweep`
    // on those are set to 0 that do not change the eigenvalues.
    Jacobi(const float* rows, int stride, int thresholdSweeps, int skipSweep) :
        evalues{rows[0], rows[stride + 1], rows[2 * stride + 2]}, thresholdSweeps_(thresholdSweeps),
        skipSweep_(skipSweep), off_{Real(rows[stride + 2]), Real(rows[2]), Real(rows[1])}, sums_{Real(evalues[0]),
                                                                                                 Real(evalues[1]),
                                                                                                 Real(evalues[2])}
    {
    }

    // Returns whether the rotations converged within 50 sweeps.
    bool run()
    {
        for (; sweeps < 50; ++sweeps) {
            const Real sum = std::abs(off_[2]) + std::abs(off_[1]) + std::abs(off_[0]);
            if (sum == 0)
                return true;
            const Real threshold = sweeps < thresholdSweeps_ ? static_cast<Real>(0.2) * sum / 9 : 0;
            Real shifts[3] = {0, 0, 0};
            visit<0, 1>(threshold, shifts);
            visit<0, 2>(threshold, shifts);
            visit<1, 2>(threshold, shifts);
            for (int i = 0; i < 3; ++i) {
                sums_[i] += shifts[i];
                evalues[i] = static_cast<float>(sums_[i]);
            }
        }
        return false;
    }

private:
    // Element p, q is off_[3 - p - q]: the index is the one that both lack.
    template <int P, int Q>
    [[gnu::always_inline]] void visit(Real threshold, Real (&shifts)[3])
    {
        Real& element = off_[3 - P - Q];
        const Real g = 100 * std::abs(element);
        if (sweeps >= skipSweep_ && isLostIn(evalues[P], g) && isLostIn(evalues[Q], g))
            element = 0;
        else if (std::abs(element) > threshold)
            rotate<P, Q>(g, shifts);
    }

    // An eigenvalue is a float, so the element is compared in float.
    static bool isLostIn(float value, Real g)
    {
        return static_cast<float>(g + static_cast<Real>(std::abs(value))) == std::abs(value);
    }

    template <int P, int Q>
    [[gnu::always_inline]] void rotate(Real g, Real (&shifts)[3])
    {
        Real& element = off_[3 - P - Q];
        const Real t = tangent(static_cast<Real>(evalues[Q]) - static_cast<Real>(evalues[P]), g, element);
        const Real c = 1 / std::sqrt(t * t + 1);
        const Real s = t * c;
        const Real tau = s / (1 + c);
        const Real shift = t * element;
        shifts[P] -= shift;
        shifts[Q] += shift;
        evalues[P] = static_cast<float>(static_cast<Real>(evalues[P]) - shift);
        evalues[Q] = static_cast<float>(static_cast<Real>(evalues[Q]) + shift);
        element = 0;
        turn(off_[Q], off_[P], s, tau);
        for (int row = 0; row < 3; ++row)
            turn(evectors[row][P], evectors[row][Q], s, tau);
        ++rotations;
    }

    // Of the angle that makes `element` vanish between eigenvalues that differ by `h`.
    static Real tangent(Real h, Real g, Real element)
    {
        if (g + std::abs(h) == std::abs(h))
            return element / h;
        const Real theta = h / 2 / element;
        // The root is a double in either case.
        const auto t = static_cast<Real>(
            1 / (static_cast<double>(std::abs(theta)) + std::sqrt(static_cast<double>(theta * theta + 1))));
        return theta < 0 ? -t : t;
    }

    template <typename Element>
    [[gnu::always_inline]] static void turn(Element& first, Element& second, Real s, Real tau)
    {
        const Real g = static_cast<Real>(first);
        const Real h = static_cast<Real>(second);
        first = static_cast<Element>(g - s * (h + g * tau));
        second = static_cast<Element>(h + s * (g - h * tau));
    }

    int thresholdSweeps_, skipSweep_;
    Real off_[3];
    Real sums_[3];  // the eigenvalues, to which the shifts of a whole sweep are added at once
};

}  // namespace kplib::detail
