#pragma once

#include <kplib/foundation/KpExport.h>

/// Student's t-test and the special functions under it, after W. H. Press et al., "Numerical Recipes", 2nd edition, 6.1
/// and 6.4. Pure functions.
///
/// Accuracy: gammln() has six digits. betai() has a relative error of at most 1e-5 for parameters up to 500 and 1e-4 up
/// to 20,000. Small t lose more, see integratedStudentDistribution().
class KPLIB_API KpStatistics {
public:
    KpStatistics() = delete;

    /// The natural logarithm of the gamma function for `x` above 0. C. Lanczos, "A precision approximation of the gamma
    /// function", 1964.
    static float gammln(float x);

    /// The continued fraction of the incomplete beta function, by Lentz's method. If 100
    /// iterations do not suffice, that is logged, and the value reached is returned.
    static float betacf(float a, float b, float x);

    /// The regularised incomplete beta function; 0 for an `x` outside 0 to 1.
    static float betai(float a, float b, float x);

    /// The probability that Student's t with `dof` degrees of freedom lies between -`t` and `t`.
    ///
    /// Computed as 1 - betai(dof / 2, 0.5, dof / (t * t + dof)) with a float argument near 1, which keeps few digits of
    /// a small t * t: the relative error is up to 6e-8 * dof / (t * t), so five digits need a t * t of at least
    /// 0.006 * dof, and a t * t below 6e-8 * dof may give 0. The absolute error is at most 2e-4 * sqrt(dof).
    static float integratedStudentDistribution(float t, float dof);

    /// The two-sided significance of the difference of two means: how probable it is that samples of these sizes and
    /// standard deviations differ at least as much by chance. Their variances are pooled.
    static float tTest(int n1, float mean1, float deviation1, int n2, float mean2, float deviation2);
};
