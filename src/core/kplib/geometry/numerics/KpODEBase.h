#pragma once

#include <kplib/foundation/KpExport.h>

/// Base of the integrators of curves in a vector field, KpODE2 in the plane and KpODE3 in space:
/// streamlines.
///
/// An embedded Runge-Kutta method follows the field with steps that are adapted to the error. The
/// curve is sampled at equal spacing of its parameter, from the cubic Hermite segment of each
/// step. The parameter is arc length, unless setNormalization(0) keeps the length of the field.
/// Set the parameters, call init(), then next() or nextSL() until they return another code than 0.
/// Nothing is logged or allocated. One thread at a time; the field is called on it.
template <typename Vector>
class KPLIB_API KpODEBase {
public:
    /// Type of points and derivatives.
    using value_type = Vector;

    /// The field at `x`. 0, or any other code where there is no field: the integration then stops with this code.
    using RightHandSide = int (*)(const Vector& x, Vector& derivative, void* userData);

    /// The Runge-Kutta pairs.
    enum Method : int {
        RK21,  ///< explicit midpoint, second order, against Euler
        RK32,  ///< Bogacki and Shampine, 3(2)
        RK43,  ///< classic fourth order, with a third-order check
        RK54,  ///< Dormand and Prince, 5(4)
        RKCK,  ///< Cash and Karp, 5(4)
    };
    /// By method: a step changes by a ratio of errors to this power.
    static const float exponent[5];

    /// What next() and the like return; other codes are those of the right-hand side.
    enum Code : int {
        Success = 0,           ///< the integration runs
        Frozen = 1,            ///< freeze() was called
        ZeroField = 2,         ///< the field is zero at the point
        StepTooSmall = 3,      ///< no step meets the tolerance
        MethodOutOfRange = 5,  ///< the method is no Method
    };

    KpODEBase() { state_.userData = this; }
    /// User data that is the object itself becomes the copy.
    KpODEBase(const KpODEBase& other) { *this = other; }
    /// Copies the state; user data that is the object itself becomes the copy.
    KpODEBase& operator=(const KpODEBase& other);
    ~KpODEBase() = default;

    /// A Method, RK43 at first; any other number ends the integration with MethodOutOfRange.
    void setMethod(int method) { state_.method = method; }
    /// `min`: a rejected step below it ends the integration with StepTooSmall, also if the field failed before. `max`
    /// bounds all steps but the first.
    void setHMinMax(float min, float max);
    /// Distance between samples along the parameter.
    void setHSampling(float hSampling) { state_.hSampling = hSampling; }
    /// The largest accepted error of a step.
    void setTolerance(float tolerance) { state_.tolerance = tolerance; }
    /// A factor on the field; -1 goes backward.
    void setOrientation(float orientation) { state_.orientation = orientation; }
    /// If not 0, the field counts with a length of `orientation` everywhere.
    void setNormalization(int normalization) { state_.normalization = normalization; }
    /// If not 0, next() gives StepTooSmall, and no sample, as soon as a step was below the smallest allowed one; the
    /// status stays.
    void setCheckHMin(int checkHMin) { state_.checkHMin = checkHMin; }
    /// `userData` is passed to each call of `field`; it is the object itself until this is called.
    void setRightHandSide(RightHandSide field, void* userData);
    /// A circular field: (-y, x), and z / 2 in space.
    static int defaultRightHandSide(const Vector& x, Vector& derivative, void* userData);

    /// Starts a curve, with a first step of `h0`; if that isn't above 0, with one derived from the tolerance.
    void init(const Vector& start, float h0 = 0);

    /// The next sample, with its derivatives by the parameter of its own segment, which runs from 0 to 1. Returns
    /// status(), or StepTooSmall without a sample if setCheckHMin() asks for that.
    ///
    /// Without `flag`, the call that ends the integration sets the end of the curve: the last accepted point. Each
    /// later call, and each call after freeze(), repeats the last regular sample (the start, if there was none). With
    /// `flag`, all these calls go on along the last cubic.
    ///
    /// A step that can no longer advance ends the integration too: with the last code other than 0 that the field gave
    /// since init(), and with StepTooSmall if it gave none.
    int next(Vector& point, int flag = 0);
    /// The same with derivatives.
    int next(Vector& point, Vector& derivative, int flag = 0);
    /// The same with derivatives.
    int next(Vector& point, Vector& derivative, Vector& secondDerivative, int flag = 0);

    /// One accepted step at its own size: the new point, the field there, and the size. On another code than 0 the
    /// three are untouched.
    int nextRK(Vector& y, Vector& f, float& hUsed);

    // One attempt at a step of h() from the current point: the new point, the field there, and the estimated error.
    // Another code than 0, and all three untouched, if the field fails.

    /// Explicit midpoint, with Euler's step as the check.
    int rk21(Vector& y, Vector& f, Vector& error) const;
    /// Bogacki and Shampine, "A 3(2) pair of Runge-Kutta formulas", Applied Mathematics Letters 2(4), 1989.
    int rk32(Vector& y, Vector& f, Vector& error) const;
    /// The classic method, with a third-order check.
    int rk43(Vector& y, Vector& f, Vector& error) const;
    /// Dormand and Prince, "A family of embedded Runge-Kutta formulae", Journal of Computational and Applied
    /// Mathematics 6(1), 1980.
    int rk54(Vector& y, Vector& f, Vector& error) const;
    /// Cash and Karp, "A variable order Runge-Kutta method for initial value problems with rapidly varying right-hand
    /// sides", ACM Transactions on Mathematical Software 16(3), 1990.
    int rkck(Vector& y, Vector& f, Vector& error) const;

    /// Samples on while the chord stays within `tolerance` of the curve (at or below 0: within a tenth of the sampling
    /// distance), but at least `minSteps` and at most `maxSteps`: streamlines of few vertices. Gives the index of the
    /// sample that it stopped at, `maxSteps` if it went through, and 0 for none.
    int nextSL(Vector& point, Vector& derivative, int minSteps, int maxSteps, float tolerance);

    /// Stops the integration, for instance at a boundary: makes `point` the current point and sets the status to
    /// Frozen. The samples of next() do not change.
    void freeze(const Vector& point);

    /// Size of the next step.
    float h() const { return state_.h; }
    float hMin() const { return state_.hMin; }                ///< see setHMinMax()
    float hMax() const { return state_.hMax; }                ///< see setHMinMax()
    float hSampling() const { return state_.hSampling; }      ///< see setHSampling()
    float tolerance() const { return state_.tolerance; }      ///< see setTolerance()
    float orientation() const { return state_.orientation; }  ///< see setOrientation()
    int checkHMin() const { return state_.checkHMin; }        ///< see setCheckHMin()

    /// 0 while the integration runs, else the code that it ended with.
    int status() const { return state_.status; }
    int normalization() const { return state_.normalization; }            ///< see setNormalization()
    int method() const { return state_.method; }                          ///< see setMethod()
    void* userData() const { return state_.userData; }                    ///< see setRightHandSide()
    RightHandSide rightHandSide() const { return state_.rightHandSide; }  ///< see setRightHandSide()

private:
    /// What a call of next() meets.
    enum class Phase {
        Running,    // the tables hold the next sample
        ShortStep,  // setCheckHMin() refuses the step: no sample, and the status stays 0
        Ending,     // the integration ended in this call
        Ended,      // it ended in an earlier call or by freeze()
    };

    struct State {
        float h = 1;              // size of the next attempt
        float hMin = 0.1F;        // a rejected step below this size is not tried smaller
        float hMax = 10;          // bound of the size that follows an accepted step
        float hSampling = 1;      // distance of two samples by the parameter
        float tolerance = 0.02F;  // bound of the length of the error of an accepted step
        float orientation = 1;    // factor on the field
        int checkHMin = 0;        // not 0: next() refuses accepted steps below hMin
        int status = Success;     // a Code or a code of the field; Success while the integration runs
        int normalization = 1;    // not 0: the field is scaled to the length `orientation`
        int method = RK43;        // a Method; any other value ends the integration at its first step
        void* userData = nullptr;
        float segmentStart = 0, segmentEnd = 0;      // parameters of the ends of the current segment
        float sample = 0;                            // parameter of the last sample asked for
        Vector lastPoint{}, lastDerivative{};        // at the start of the segment, the field scaled
        Vector currentPoint{}, currentDerivative{};  // at its end, where the next step starts
        // [0] is the sample that next() returns, the others are its forward differences for a step of hSampling: of
        // the point (a cubic), of its first derivative and of its second derivative by the parameter of the segment.
        Vector points[4]{}, derivatives[3]{}, secondDerivatives[2]{};
        RightHandSide rightHandSide = defaultRightHandSide;
        int lastFailure = Success;  // code of the last failed attempt since init(); Success if none failed
    };

    template <typename Tableau>
    int attemptWith(Vector& y, Vector& f, Vector& error) const;
    int attempt(Vector& y, Vector& f, Vector& error) const;
    int attemptWithSmallerSteps(Vector& y, Vector& f, Vector& error);
    bool isMethod() const { return state_.method >= RK21 && state_.method <= RKCK; }
    double stepFactor(float error) const;

    int evaluate(const Vector& x, Vector& derivative) const;
    bool orient(Vector& derivative) const;

    Phase advanceToSample();
    Phase nextSegment();
    int stepTooSmall() const;
    void setCubic();
    void advanceDifferences();

    State state_;
};
