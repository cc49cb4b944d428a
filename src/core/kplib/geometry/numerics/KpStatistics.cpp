#include <kplib/geometry/numerics/KpStatistics.h>

#include <kplib/log/KpLogFile.h>

#include <cmath>

namespace {

// Keeps a denominator away from 0.
float lifted(float denominator)
{
    constexpr float least = 1e-30F;
    return std::abs(denominator) < least ? least : denominator;
}

// Lentz's evaluation of a continued fraction whose partial denominators are all 1.
struct Lentz {
    float c = 1, d, h;

    explicit Lentz(float first) : d(1 / lifted(first)), h(d) {}
    // Takes the next partial numerator, and returns the factor by which the value changed.
    float step(float numerator)
    {
        d = 1 / lifted(1 + numerator * d);
        c = lifted(1 + numerator / c);
        h *= d * c;
        return d * c;
    }
};

double logGamma(double z)
{
    constexpr double coefficients[] = {76.18009172947146,  -86.50532032941678,   24.01409824083091,
                                       -1.231739572450155, 0.001208650973866179, -5.395239384953e-06};
    const double shifted = z + 5.5;
    const double t = shifted - (z + 0.5) * std::log(shifted);
    double series = 1.000000000190015, y = z;
    for (const double coefficient : coefficients)
        series += coefficient / ++y;
    return std::log(2.5066282746310007 * series / z) - t;
}

}  // namespace

float KpStatistics::gammln(float x)
{
    return static_cast<float>(logGamma(static_cast<double>(x)));
}

float KpStatistics::betacf(float a, float b, float x)
{
    constexpr int rounds = 100;
    constexpr float enough = 3e-7F;
    Lentz fraction(1 - (a + b) * x / (a + 1));
    for (int i = 1; i <= rounds; ++i) {
        const auto m = static_cast<float>(i);
        const float even = a + 2 * m;
        fraction.step(m * (b - m) * x / ((even - 1) * even));
        const float delta = fraction.step(-(a + m) * (a + b + m) * x / (even * (even + 1)));
        if (std::abs(delta - 1) < enough)
            return fraction.h;
    }
    getTheLogInstance().printf("a or b too big, or MAXIT too small in betacf\n");
    return fraction.h;
}

float KpStatistics::betai(float a, float b, float x)
{
    if (x < 0 || x > 1)
        return 0;
    const double realA = static_cast<double>(a), realB = static_cast<double>(b), realX = static_cast<double>(x);
    float front = 0;
    if (x != 0 && x != 1) {
        // In double precision: for large arguments the logarithms nearly cancel.
        const double beta = logGamma(realA + realB) - logGamma(realA) - logGamma(realB);
        front = static_cast<float>(std::exp(beta + realA * std::log(realX) + realB * std::log(1 - realX)));
    }
    // The fraction converges fast on one side of the mean; symmetry gives the other side.
    if (realX < (realA + 1) / (realA + realB + 2))
        return front * betacf(a, b, x) / a;
    return 1 - front * betacf(b, a, 1 - x) / b;
}

float KpStatistics::integratedStudentDistribution(float t, float dof)
{
    return 1 - betai(dof / 2, 0.5F, dof / (t * t + dof));
}

float KpStatistics::tTest(int n1, float mean1, float deviation1, int n2, float mean2, float deviation2)
{
    const long product = static_cast<long>(n1) * n2;
    const double sum = static_cast<double>(n1) + n2, dof = sum - 2;
    const double d1 = static_cast<double>(deviation1), d2 = static_cast<double>(deviation2);
    const double spread = std::sqrt((n2 - 1.0) * d2 * d2 + (n1 - 1.0) * d1 * d1);
    const double difference = static_cast<double>(mean1) - static_cast<double>(mean2);
    const double t = difference / spread * std::sqrt(static_cast<double>(product) * dof / sum);
    return 1 - integratedStudentDistribution(static_cast<float>(t), static_cast<float>(dof));
}
