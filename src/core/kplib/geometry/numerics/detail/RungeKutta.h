#pragma once

namespace kplib::detail {

// Explicit embedded Runge-Kutta methods. Stage i is at y + h * sum a[i][j] k[j]; b are the weights
// of the new
// point, where the field is evaluated once more, and e those of the error, for all stages and this last evaluation.

struct Midpoint {
    static constexpr int stages = 2;
    static constexpr double a[stages][stages] = {{}, {1.0 / 2}};
    static constexpr double b[stages] = {0, 1};
    static constexpr double e[stages + 1] = {-1, 1};
};

struct BogackiShampine {
    static constexpr int stages = 3;
    static constexpr double a[stages][stages] = {{}, {1.0 / 2}, {0, 3.0 / 4}};
    static constexpr double b[stages] = {2.0 / 9, 1.0 / 3, 4.0 / 9};
    static constexpr double e[stages + 1] = {2.0 / 9 - 7.0 / 24, 1.0 / 3 - 1.0 / 4, 4.0 / 9 - 1.0 / 3, -1.0 / 8};
};

struct Classic {
    static constexpr int stages = 4;
    static constexpr double a[stages][stages] = {{}, {1.0 / 2}, {0, 1.0 / 2}, {0, 0, 1}};
    static constexpr double b[stages] = {1.0 / 6, 1.0 / 3, 1.0 / 3, 1.0 / 6};
    static constexpr double e[stages + 1] = {0, 0, 0, 1.0 / 6, -1.0 / 6};
};

struct DormandPrince {
    static constexpr int stages = 6;
    static constexpr double a[stages][stages] = {
        {},
        {1.0 / 5},
        {3.0 / 40, 9.0 / 40},
        {44.0 / 45, -56.0 / 15, 32.0 / 9},
        {19372.0 / 6561, -25360.0 / 2187, 64448.0 / 6561, -212.0 / 729},
        {9017.0 / 3168, -355.0 / 33, 46732.0 / 5247, 49.0 / 176, -5103.0 / 18656},
    };
    static constexpr double b[stages] = {35.0 / 384, 0, 500.0 / 1113, 125.0 / 192, -2187.0 / 6784, 11.0 / 84};
    static constexpr double e[stages + 1] = {71.0 / 57600,      0,          -71.0 / 16695, 71.0 / 1920,
                                             -17253.0 / 339200, 22.0 / 525, -1.0 / 40};
};

struct CashKarp {
    static constexpr int stages = 6;
    static constexpr double a[stages][stages] = {
        {},
        {1.0 / 5},
        {3.0 / 40, 9.0 / 40},
        {3.0 / 10, -9.0 / 10, 6.0 / 5},
        {-11.0 / 54, 5.0 / 2, -70.0 / 27, 35.0 / 27},
        {1631.0 / 55296, 175.0 / 512, 575.0 / 13824, 44275.0 / 110592, 253.0 / 4096},
    };
    static constexpr double b[stages] = {37.0 / 378, 0, 250.0 / 621, 125.0 / 594, 0, 512.0 / 1771};
    static constexpr double e[stages + 1] = {
        37.0 / 378 - 2825.0 / 27648, 0, 250.0 / 621 - 18575.0 / 48384, 125.0 / 594 - 13525.0 / 55296, -277.0 / 14336,
        512.0 / 1771 - 1.0 / 4};
};

template <typename Vector>
Vector weightedSum(const double* weights, const Vector* k, int count)
{
    Vector sum{};
    for (int i = 0; i < count; ++i) {
        if (weights[i] != 0)
            sum += static_cast<float>(weights[i]) * k[i];
    }
    return sum;
}

// A step of `h` from `y0`, where the field is `k1`. `evaluate(x, k)` returns 0, or a code that
// ends the step with
// nothing written.
template <typename Tableau, typename Vector, typename Evaluate>
int rungeKuttaStep(const Vector& y0, const Vector& k1, float h, Evaluate evaluate, Vector& y, Vector& f, Vector& error)
{
    Vector k[Tableau::stages + 1];
    k[0] = k1;
    for (int i = 1; i < Tableau::stages; ++i) {
        if (const int code = evaluate(y0 + h * weightedSum(Tableau::a[i], k, i), k[i]))
            return code;
    }
    const Vector end = y0 + h * weightedSum(Tableau::b, k, Tableau::stages);
    if (const int code = evaluate(end, k[Tableau::stages]))
        return code;
    error = h * weightedSum(Tableau::e, k, Tableau::stages + 1);
    y = end;
    f = k[Tableau::stages];
    return 0;
}

}  // namespace kplib::detail
