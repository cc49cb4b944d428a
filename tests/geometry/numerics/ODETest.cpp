#include <kplib/geometry/numerics/KpODE2.h>
#include <kplib/geometry/numerics/KpODE3.h>

#include <gtest/gtest.h>

#include <cmath>
#include <tuple>

namespace {

// The methods with the powers of the step in the error of a step, and in its estimate.
const std::tuple<int (KpODE3::*)(KpVec3f&, KpVec3f&, KpVec3f&) const, int, int, int> methods[] = {
    {&KpODE3::rk21, KpODE3::RK21, 3, 2}, {&KpODE3::rk32, KpODE3::RK32, 4, 3}, {&KpODE3::rk43, KpODE3::RK43, 5, 4},
    {&KpODE3::rk54, KpODE3::RK54, 6, 5}, {&KpODE3::rkck, KpODE3::RKCK, 6, 5},
};

// Its curves are x(t) = tan(t + a), y(t) = y0 exp(sin t) with z the time: no order condition is empty on it.
int curved(const KpVec3f& x, KpVec3f& derivative, void* /*userData*/)
{
    derivative = KpVec3f(1 + x.x() * x.x(), x.y() * std::cos(x.z()), 1);
    return 0;
}

TEST(KpODE, attemptsHaveTheOrderOfTheirMethod)
{
    for (const auto& [attempt, method, order, errorOrder] : methods) {
        SCOPED_TRACE(method);
        float errors[2], estimates[2], step = order == 6 ? 0.5F : 0.25F;
        for (int i = 0; i < 2; ++i, step /= 2) {
            KpODE3 ode;
            ode.setRightHandSide(curved, nullptr);
            ode.setNormalization(0);
            ode.init(KpVec3f(0.2F, 1, 0), step);
            KpVec3f y, f, error, field;
            ASSERT_EQ((ode.*attempt)(y, f, error), 0);
            curved(y, field, nullptr);
            EXPECT_EQ(f, field);
            errors[i] = (y - KpVec3f(std::tan(step + std::atan(0.2F)), std::exp(std::sin(step)), step)).length();
            estimates[i] = error.length();
        }
        EXPECT_GT(std::log2(errors[0] / errors[1]), order - 0.6F);  // any wrong coefficient costs an order
        EXPECT_GT(std::log2(estimates[0] / estimates[1]), errorOrder - 0.6F);
        EXPECT_LT(errors[1], estimates[1]);
    }
}

TEST(KpODE, samplesTheCircleByItsArcLength)
{
    for (const auto& [attempt, method, order, errorOrder] : methods) {
        for (const float orientation : {1.0F, -1.0F}) {
            SCOPED_TRACE(testing::Message() << method << ' ' << orientation);
            KpODE2 ode;
            ode.setMethod(method);
            ode.setOrientation(orientation);
            ode.setTolerance(1e-4F);
            ode.setHMinMax(1e-4F, 0.5F);
            ode.setHSampling(0.03F);
            ode.init(KpVec2f(2, 0), 5);  // far too long a step
            for (int i = 1; i <= 300; ++i) {
                KpVec2f point, derivative, second;
                ASSERT_EQ(ode.next(point, derivative, second), 0);
                const float angle = orientation * 0.03F * static_cast<float>(i) / 2;
                const KpVec2f radius(std::cos(angle), std::sin(angle));
                EXPECT_LT((point - radius * 2.0F).length(), 0.01F) << i;
                const float dt = derivative.length();  // both are by the parameter of the segment
                EXPECT_GT(derivative.dot(KpVec2f(-radius.y(), radius.x())) * orientation, 0.999F * dt) << i;
                EXPECT_LT((second + radius * (dt * dt / 2)).length(), 0.2F * dt * dt) << i;
            }
        }
    }
}

// Along x until the field ends.
int half(const KpVec2f& x, KpVec2f& derivative, void* code)
{
    derivative = KpVec2f(3, 0);
    return x.x() <= 2 ? 0 : *static_cast<int*>(code);
}

TEST(KpODE, endsAtItsLastPointThenRepeatsTheSampleOrGoesOnAlongTheLastCubic)
{
    int code = 77;
    KpODE2 ode;
    ode.setRightHandSide(half, &code);
    ode.setHMinMax(0.1F, 0.5F);
    ode.setHSampling(0.3F);
    ode.init(KpVec2f(0, 1), 0.5F);
    KpVec2f point;
    for (int i = 1; i <= 6; ++i) {
        ASSERT_EQ(ode.next(point), 0);
        EXPECT_NEAR(point.x(), 0.3F * static_cast<float>(i), 1e-5F);
    }
    KpODE2 flagged = ode;
    const KpVec2f sample = point;
    EXPECT_EQ(ode.next(point), code);
    EXPECT_EQ(std::tuple(ode.status(), point), std::tuple(code, KpVec2f(2, 1)));
    EXPECT_FLOAT_EQ(ode.h(), 0.5F / 16);  // quartered twice
    EXPECT_EQ(ode.next(point), code);
    EXPECT_EQ(point, sample);
    for (int i = 1; i <= 3; ++i) {
        EXPECT_EQ(flagged.next(point, 1), code);
        EXPECT_NEAR(point.x(), 1.8F + 0.3F * static_cast<float>(i), 1e-5F);
    }
    const KpVec2f beyond = point;
    flagged.freeze(KpVec2f(5, 6));
    EXPECT_EQ(flagged.next(point), KpODE2::Frozen);
    EXPECT_EQ(point, beyond);
}

// Circles, and a wall at x = 0 whose code is the user data.
int walled(const KpVec2f& x, KpVec2f& derivative, void* code)
{
    derivative = KpVec2f(-x.y(), x.x());
    return x.x() > 0 ? 0 : *static_cast<int*>(code);
}

TEST(KpODE, passesOnTheCodeOfAWallHoweverTheStepsEnd)
{
    int code = 7;
    for (int i = 0; i < 500; ++i) {
        KpODE2 ode;
        ode.setMethod(i % 5);
        ode.setHMinMax(i % 3 == 0 ? 0 : 0.1F, 10);
        ode.setRightHandSide(walled, &code);
        ode.init(KpVec2f(1 + 0.01F * static_cast<float>(i), 0.5F));
        KpVec2f point;
        for (int samples = 0; samples < 100 && ode.next(point) == 0; ++samples) {
        }
        EXPECT_EQ(ode.status(), code) << i;
    }
    KpODE2 inaccurate;  // quartered twice at the wall, then rejected below the smallest step
    inaccurate.setRightHandSide(walled, &code);
    inaccurate.setTolerance(0);
    inaccurate.init(KpVec2f(0.1F, 1), 1);
    KpVec2f point;
    EXPECT_EQ(inaccurate.next(point), KpODE2::StepTooSmall);
}

TEST(KpODE, tellsWhyItEnds)
{
    using O = KpODE2;
    float zero = 0, noNumber = NAN;
    const auto uniform = [](const KpVec2f&, KpVec2f& derivative, void* s) {
        return derivative = KpVec2f(*static_cast<const float*>(s), 0), 0;
    };
    // Without a speed, the circular field.
    const std::tuple<const char*, float*, int, int, float, float, float, int> cases[] = {
        {"no field", &zero, 2, 0, 0.02F, 0.1F, 10, O::ZeroField},
        {"no such method", nullptr, 5, 0, 0.02F, 0.1F, 10, O::MethodOutOfRange},
        {"negative method", nullptr, -1, 0, 0.02F, 0.1F, 10, O::MethodOutOfRange},
        {"tolerance out of reach", nullptr, 2, 0, 0, 0.1F, 10, O::StepTooSmall},
        {"no step is good enough", nullptr, 2, 0, -1, 0, 10, O::StepTooSmall},
        {"steps of no length", nullptr, 2, 0, 0.02F, 0, 0, O::StepTooSmall},
        {"short steps unwanted", nullptr, 2, 1, 0.02F, 0.2F, 0.1F, O::StepTooSmall},
        {"no numbers", &noNumber, 2, 0, 0.02F, 0.1F, 10, O::StepTooSmall},
    };
    for (const auto& [what, speed, method, checkHMin, tolerance, hMin, hMax, expected] : cases) {
        SCOPED_TRACE(what);
        KpODE2 ode;
        if (speed)
            ode.setRightHandSide(uniform, speed);
        ode.setMethod(method);
        ode.setCheckHMin(checkHMin);
        ode.setTolerance(tolerance);
        ode.setHMinMax(hMin, hMax);
        ode.init(KpVec2f(1, 0), 1);
        KpVec2f point;
        int code = 0;
        for (int i = 0; i < 1000 && code == 0; ++i)
            code = ode.next(point);
        EXPECT_EQ(code, expected);
        EXPECT_EQ(ode.status(), checkHMin ? O::Success : expected);
        EXPECT_EQ(std::isnan(point.x()), speed == &noNumber);
    }
}

TEST(KpODE, derivesTheFirstStep)
{
    KpODE3 ode;
    ode.setTolerance(0.0081F);
    ode.setNormalization(0);
    ode.init(KpVec3f(0, 2, 0));
    EXPECT_FLOAT_EQ(ode.h(), 0.15F);  // 0.3, for a field of length 2
    ode.setTolerance(1e9F);
    ode.init(KpVec3f(0, 2, 0), -1);
    EXPECT_FLOAT_EQ(ode.h(), 5);
    ode.init(KpVec3f(0, 0, 4), 7);  // straight up
    EXPECT_FLOAT_EQ(ode.h(), 7);
    KpVec3f point, derivative;
    EXPECT_EQ(ode.next(point, derivative), 0);
    EXPECT_LT((derivative - KpVec3f(0, 0, derivative.z())).length(), 1e-6F);
}

TEST(KpODE, copiesPointToThemselves)
{
    KpODE2 ode;
    const KpODE2 copy(ode);
    EXPECT_EQ(copy.userData(), &copy);
    int other = 0;
    ode.setRightHandSide(half, &other);
    EXPECT_EQ(KpODE2(ode).userData(), &other);
}

TEST(KpODE, walksAsFarAsAChordIsNear)
{
    int code = 9;
    const std::tuple<bool, int, int, float, int, int> cases[] = {
        {true, 0, 5, 0.1F, 5, 5},    {true, 0, -3, 0.1F, 0, 0},   {true, 0, 50, 0.1F, 6, 10},  // the field ends
        {false, 7, 50, 1e-6F, 7, 7}, {false, 0, 50, 1e-6F, 0, 0}, {false, 0, 50, -1, 1, 15},
    };
    for (const auto& [isStraight, minSteps, maxSteps, tolerance, low, high] : cases) {
        KpODE2 ode;
        if (isStraight)
            ode.setRightHandSide(half, &code);
        ode.setHSampling(0.1F);
        ode.init(KpVec2f(1, 0), 0.1F);
        KpVec2f point, derivative;
        const int steps = ode.nextSL(point, derivative, minSteps, maxSteps, tolerance);
        EXPECT_EQ(std::clamp(steps, low, high), steps);
    }
}

}  // namespace
