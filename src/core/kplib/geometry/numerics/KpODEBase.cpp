#include <kplib/geometry/numerics/KpODEBase.h>

#include <kplib/geometry/numerics/KpODE2.h>
#include <kplib/geometry/numerics/KpODE3.h>
#include <kplib/geometry/numerics/detail/RungeKutta.h>

#include <algorithm>
#include <cmath>
#include <iterator>

// Plan
//
// Steps: nextRK() repeats attempts of the method until one is accepted. An attempt that leaves the field is repeated
// with a quarter of the step, at most twice in a row. With err the length of the error vector of an attempt that
// succeeds,
//
//     factor = (0.8 tolerance / err) ^ exponent[method]
//
//     err <= tolerance or NaN: accepted, then h = min(h * min(factor, 2), hMax)
//     err >  tolerance:        rejected, then the end if h < hMin or h = 0,
//                              otherwise h = h * max(factor, 0.5)
//
// Samples: each accepted step from (y0, k0) to (y1, k1) over the parameters start to start + dt is a segment of the
// curve, a Hermite cubic in u = (parameter - start) / dt:
//
//     d0 = dt k0, d1 = dt k1
//     a = 2 y0 - 2 y1 + d0 + d1
//     b = 3 y1 - 3 y0 - 2 d0 - d1
//     p(u) = ((a u + b) u + d0) u + y0
//
// The first sample of a segment evaluates p, p' and p'' and their forward differences for du = hSampling / dt; each
// further one costs six additions of vectors:
//
//     sample:   0      1      2          3                     (parameter / hSampling)
//     segment:  |---------------|-----------|---- ...          (steps of their own sizes)
//               init  cubic  differences  cubic
//
// If the field ends at a wall, the steps shrink without end: an attempt across the wall fails, an
// attempt with a quarter of its size is accepted, the size doubles, and the next attempt fails
// again. Three failures in a row may then not occur before the step is too small to advance. The
// integration ends there with lastFailure, the last code of the field other than 0.

namespace {

float lengthOf(const KpVec2f& v)
{
    return v.hypot();
}

float lengthOf(const KpVec3f& v)
{
    return v.length();
}

}  // namespace

template <>
int KpODEBase<KpVec2f>::defaultRightHandSide(const KpVec2f& x, KpVec2f& derivative, void* /*userData*/)
{
    derivative = KpVec2f(-x.y(), x.x());
    return 0;
}

template <>
int KpODEBase<KpVec3f>::defaultRightHandSide(const KpVec3f& x, KpVec3f& derivative, void* /*userData*/)
{
    derivative = KpVec3f(-x.y(), x.x(), x.z() * 0.5F);
    return 0;
}

template <typename Vector>
const float KpODEBase<Vector>::exponent[5] = {0.5F, 0.33333334F, 0.25F, 0.2F, 0.2F};

template <typename Vector>
KpODEBase<Vector>& KpODEBase<Vector>::operator=(const KpODEBase& other)
{
    const bool isOwnData = other.state_.userData == &other;
    state_ = other.state_;
    if (isOwnData)
        state_.userData = this;
    return *this;
}

template <typename Vector>
void KpODEBase<Vector>::setHMinMax(float min, float max)
{
    state_.hMin = min;
    state_.hMax = max;
}

template <typename Vector>
void KpODEBase<Vector>::setRightHandSide(RightHandSide field, void* userData)
{
    state_.rightHandSide = field;
    state_.userData = userData;
}

template <typename Vector>
void KpODEBase<Vector>::init(const Vector& start, float h0)
{
    State& s = state_;
    Vector derivative{};
    if (s.rightHandSide(start, derivative, s.userData) == 0)
        orient(derivative);
    s.lastPoint = s.currentPoint = start;
    s.lastDerivative = s.currentDerivative = derivative;
    s.segmentStart = s.segmentEnd = s.sample = 0;
    std::fill(std::begin(s.points), std::end(s.points), Vector{});
    std::fill(std::begin(s.derivatives), std::end(s.derivatives), Vector{});
    std::fill(std::begin(s.secondDerivatives), std::end(s.secondDerivatives), Vector{});
    s.points[0] = start;  // the last sample if there is no segment
    s.derivatives[0] = derivative;
    s.status = s.lastFailure = Success;
    if (h0 > 0) {
        s.h = h0;
        return;
    }
    const double step =
        std::pow(static_cast<double>(s.tolerance), static_cast<double>(exponent[isMethod() ? s.method : RKCK]));
    const float length = lengthOf(derivative);
    s.h = std::min(static_cast<float>(length == 0 ? step : step / static_cast<double>(length)), 5 * s.hSampling);
}

// Scales the derivative by the orientation; false for a derivative of length 0.
template <typename Vector>
bool KpODEBase<Vector>::orient(Vector& derivative) const
{
    const double length = std::sqrt(static_cast<double>(derivative.squaredLength()));
    if (length == 0)
        return false;
    derivative *= state_.normalization ? static_cast<float>(static_cast<double>(state_.orientation) / length)
                                       : state_.orientation;
    return true;
}

template <typename Vector>
int KpODEBase<Vector>::evaluate(const Vector& x, Vector& derivative) const
{
    if (const int code = state_.rightHandSide(x, derivative, state_.userData))
        return code;
    return orient(derivative) ? Success : ZeroField;
}

template <typename Vector>
template <typename Tableau>
int KpODEBase<Vector>::attemptWith(Vector& y, Vector& f, Vector& error) const
{
    const auto field = [this](const Vector& x, Vector& k) { return evaluate(x, k); };
    return kplib::detail::rungeKuttaStep<Tableau>(state_.currentPoint, state_.currentDerivative, state_.h, field, y, f,
                                                  error);
}

template <typename Vector>
int KpODEBase<Vector>::rk21(Vector& y, Vector& f, Vector& error) const
{
    return attemptWith<kplib::detail::Midpoint>(y, f, error);
}

template <typename Vector>
int KpODEBase<Vector>::rk32(Vector& y, Vector& f, Vector& error) const
{
    return attemptWith<kplib::detail::BogackiShampine>(y, f, error);
}

template <typename Vector>
int KpODEBase<Vector>::rk43(Vector& y, Vector& f, Vector& error) const
{
    return attemptWith<kplib::detail::Classic>(y, f, error);
}

template <typename Vector>
int KpODEBase<Vector>::rk54(Vector& y, Vector& f, Vector& error) const
{
    return attemptWith<kplib::detail::DormandPrince>(y, f, error);
}

template <typename Vector>
int KpODEBase<Vector>::rkck(Vector& y, Vector& f, Vector& error) const
{
    return attemptWith<kplib::detail::CashKarp>(y, f, error);
}

template <typename Vector>
int KpODEBase<Vector>::attempt(Vector& y, Vector& f, Vector& error) const
{
    switch (state_.method) {
    case RK21:
        return rk21(y, f, error);
    case RK32:
        return rk32(y, f, error);
    case RK43:
        return rk43(y, f, error);
    case RK54:
        return rk54(y, f, error);
    case RKCK:
        return rkck(y, f, error);
    default:
        return MethodOutOfRange;
    }
}

// Repeats an attempt that leaves the field with a quarter of the step, at most twice.
template <typename Vector>
int KpODEBase<Vector>::attemptWithSmallerSteps(Vector& y, Vector& f, Vector& error)
{
    for (int retry = 0;; ++retry) {
        const int code = attempt(y, f, error);
        if (code == Success)
            return code;
        state_.lastFailure = code;
        if (retry == 2)
            return code;
        state_.h *= 0.25F;
    }
}

template <typename Vector>
double KpODEBase<Vector>::stepFactor(float error) const
{
    const float ratio = static_cast<float>(static_cast<double>(state_.tolerance) * 0.8 / static_cast<double>(error));
    return std::pow(static_cast<double>(ratio), static_cast<double>(exponent[state_.method]));
}

// The code for a step that cannot advance: the last code of the field, if it failed since init().
template <typename Vector>
int KpODEBase<Vector>::stepTooSmall() const
{
    return state_.lastFailure != Success ? state_.lastFailure : static_cast<int>(StepTooSmall);
}

template <typename Vector>
int KpODEBase<Vector>::nextRK(Vector& y, Vector& f, float& hUsed)
{
    if (!isMethod())
        return MethodOutOfRange;
    Vector point, derivative, error;
    for (;;) {
        if (const int code = attemptWithSmallerSteps(point, derivative, error))
            return code;
        const float err = lengthOf(error);
        if (!(err > state_.tolerance)) {
            hUsed = state_.h;
            y = state_.currentPoint = point;
            f = state_.currentDerivative = derivative;
            const double factor = err == 0 ? 2 : std::min(stepFactor(err), 2.0);
            state_.h = std::min(static_cast<float>(static_cast<double>(state_.h) * factor), state_.hMax);
            return Success;
        }
        if (state_.h < state_.hMin)
            return StepTooSmall;
        if (state_.h == 0)  // cannot shrink
            return stepTooSmall();
        const double factor = err == 0 ? 0.5 : std::max(0.5, stepFactor(err));  // a NaN counts as 0.5
        state_.h = static_cast<float>(static_cast<double>(state_.h) * factor);
    }
}

template <typename Vector>
int KpODEBase<Vector>::next(Vector& point, int flag)
{
    Vector derivative;
    return next(point, derivative, flag);
}

template <typename Vector>
int KpODEBase<Vector>::next(Vector& point, Vector& derivative, int flag)
{
    Vector secondDerivative;
    return next(point, derivative, secondDerivative, flag);
}

template <typename Vector>
int KpODEBase<Vector>::next(Vector& point, Vector& derivative, Vector& secondDerivative, int flag)
{
    State& s = state_;
    const Phase phase = s.status == Success ? advanceToSample() : Phase::Ended;
    if (phase == Phase::ShortStep)
        return StepTooSmall;
    if (phase != Phase::Running && flag)
        advanceDifferences();
    const bool isEndOfCurve = phase == Phase::Ending && !flag;
    point = isEndOfCurve ? s.lastPoint : s.points[0];
    derivative = isEndOfCurve ? s.lastDerivative : s.derivatives[0];
    secondDerivative = s.secondDerivatives[0];
    return s.status;
}

// Advances the tables by one sample, with as many integration steps as it requires.
template <typename Vector>
auto KpODEBase<Vector>::advanceToSample() -> Phase
{
    State& s = state_;
    s.sample += s.hSampling;
    if (!(s.sample > s.segmentEnd)) {
        advanceDifferences();
        return Phase::Running;
    }
    while (s.sample > s.segmentEnd) {
        if (const Phase phase = nextSegment(); phase != Phase::Running)
            return phase;
    }
    setCubic();
    return Phase::Running;
}

template <typename Vector>
auto KpODEBase<Vector>::nextSegment() -> Phase
{
    State& s = state_;
    s.lastPoint = s.currentPoint;
    s.lastDerivative = s.currentDerivative;
    s.segmentStart = s.segmentEnd;
    Vector y, f;
    float hUsed = 0;
    s.status = nextRK(y, f, hUsed);
    if (s.status != Success)
        return Phase::Ending;
    if (s.checkHMin && hUsed < s.hMin)
        return Phase::ShortStep;
    s.segmentEnd += hUsed;
    if (!(s.segmentEnd > s.segmentStart))
        s.status = stepTooSmall();
    return s.status == Success ? Phase::Running : Phase::Ending;
}

// The Hermite cubic of the segment at the sample, with the differences for a sampling distance.
template <typename Vector>
void KpODEBase<Vector>::setCubic()
{
    State& s = state_;
    const float dt = s.segmentEnd - s.segmentStart;
    const float u = (s.sample - s.segmentStart) / dt, du = s.hSampling / dt;
    const Vector d0 = dt * s.lastDerivative, d1 = dt * s.currentDerivative;
    const Vector& y0 = s.lastPoint;
    const Vector& y1 = s.currentPoint;
    const Vector a = 2.0F * y0 - 2.0F * y1 + d0 + d1;
    const Vector b = 3.0F * y1 - 3.0F * y0 - 2.0F * d0 - d1;
    s.points[0] = ((a * u + b) * u + d0) * u + y0;
    s.points[1] = du * ((a * (3 * u * u + 3 * u * du + du * du) + b * (2 * u + du)) + d0);
    s.points[2] = du * du * (a * (6 * (u + du)) + 2.0F * b);
    s.points[3] = du * du * du * 6.0F * a;
    s.derivatives[0] = (3.0F * a * u + 2.0F * b) * u + d0;
    s.derivatives[1] = du * (a * (3 * (2 * u + du)) + 2.0F * b);
    s.derivatives[2] = du * du * 6.0F * a;
    s.secondDerivatives[0] = 6.0F * a * u + 2.0F * b;
    s.secondDerivatives[1] = du * 6.0F * a;
}

template <typename Vector>
void KpODEBase<Vector>::advanceDifferences()
{
    const auto advance = [](auto& values) {
        for (std::size_t i = 0; i + 1 < std::size(values); ++i)
            values[i] += values[i + 1];
    };
    advance(state_.points);
    advance(state_.derivatives);
    advance(state_.secondDerivatives);
}

template <typename Vector>
int KpODEBase<Vector>::nextSL(Vector& point, Vector& derivative, int minSteps, int maxSteps, float tolerance)
{
    if (!(tolerance > 0))
        tolerance = state_.hSampling * 0.1F;
    float length = 0, curvature = 0;
    int i = 0;
    for (; i < maxSteps; ++i) {
        Vector secondDerivative;
        if (next(point, derivative, secondDerivative) != Success)
            break;
        curvature = std::max(curvature, lengthOf(secondDerivative));
        length += state_.hSampling;
        if (i >= minSteps && length * length * curvature * 0.125F > tolerance)
            break;
    }
    return i;
}

template <typename Vector>
void KpODEBase<Vector>::freeze(const Vector& point)
{
    state_.currentPoint = point;
    state_.status = Frozen;
}

template class KpODEBase<KpVec2f>;
template class KpODEBase<KpVec3f>;
