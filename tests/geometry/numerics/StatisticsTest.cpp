#include <kplib/geometry/numerics/KpSimAnnState.h>
#include <kplib/geometry/numerics/KpSimulatedAnnealer.h>
#include <kplib/geometry/numerics/KpStatistics.h>

#include "support/LogCapture.h"

#include <gtest/gtest.h>

#include <cmath>
#include <random>

namespace {

using kplib::test::LogCapture;
using Stats = KpStatistics;

TEST(Statistics, functionsAgreeWithTablesAndClosedForms)
{
    for (const double x : {0.1, 0.5, 1.0, 2.5, 10.0, 100.0})
        EXPECT_NEAR(Stats::gammln(static_cast<float>(x)), std::lgamma(x), 1e-6 * std::max(1.0, std::lgamma(x)));
    for (const double x : {0.0, 0.05, 0.3, 0.5, 0.9, 1.0}) {
        const double y = 1 - x;
        EXPECT_NEAR(Stats::betai(1, 1, static_cast<float>(x)), x, 1e-6);
        EXPECT_NEAR(Stats::betai(2, 3, static_cast<float>(x)), 6 * x * x * y * y + 4 * x * x * x * y + x * x * x * x,
                    2e-6);
        EXPECT_NEAR(Stats::betai(0.5F, 0.5F, static_cast<float>(x)), 2 / M_PI * std::asin(std::sqrt(x)), 2e-6);
    }
    EXPECT_NEAR(Stats::betai(3000, 3000, 0.5F), 0.5, 1e-5);  // where logarithms of 20000 nearly cancel out
    EXPECT_EQ(Stats::betai(2, 3, 2), 0);
    EXPECT_EQ(Stats::betai(2, 3, -0.1F), 0);
    // Critical values of Student's t, two-sided.
    const float table[][3] = {{1, 12.706F, 0.95F}, {5, 4.032F, 0.99F}, {120, 2.617F, 0.99F}, {10, 0, 0}};
    for (const auto& [dof, t, probability] : table)
        EXPECT_NEAR(Stats::integratedStudentDistribution(t, dof), probability, 5e-5);
}

TEST(Statistics, aFractionThatDoesNotConvergeIsLogged)
{
    const LogCapture log;
    Stats::betacf(1e6F, 1e6F, 0.5F);
    EXPECT_NE(LogCapture::lines().at(0).find("a or b too big, or MAXIT too small in betacf"), std::string::npos);
}

TEST(Statistics, theTTestIsTheTextbooks)
{
    // Equal sizes and deviations s: t = (m1 - m2) / (s sqrt(2 / n)) with 2 n - 2 degrees of freedom.
    const float t = 2.101F;  // 18 degrees of freedom, 5 %
    EXPECT_NEAR(Stats::tTest(10, t * std::sqrt(0.2F), 1, 10, 0, 1), 0.05, 5e-5);
    EXPECT_FLOAT_EQ(Stats::tTest(12, 1, 2, 7, 4, 3), Stats::tTest(7, 4, 3, 12, 1, 2));
    // A product beyond 32 bits.
    EXPECT_NEAR(Stats::tTest(60000, 1.96F * std::sqrt(2 / 6e4F), 1, 60000, 0, 1), 0.05, 5e-4);
}

/// A walk over the integers towards 17.
class Walk final : public KpSimAnnState {
public:
    int at = 200, proposals = 0, lastMade = 0;

private:
    float energyAt(int x) const { return static_cast<float>((x - 17) * (x - 17)); }
    float doSuggestChange() override
    {
        ++proposals;
        step_ = (random_() & 1) != 0 ? 1 : -1;
        return energyAt(at + step_) - energyAt(at);
    }
    void doExecuteChange() override
    {
        at += step_;
        lastMade = proposals;
    }
    float doEvaluate() override { return energyAt(at); }

    std::mt19937 random_{10};
    int step_ = 0;
};

TEST(SimulatedAnnealer, findsTheLowestEnergyAndFreezesThere)
{
    KpSimulatedAnnealer annealer;
    annealer.setStartTemperature(50);
    Walk walk;
    annealer.anneal(&walk, true);
    EXPECT_NEAR(walk.at, 17, 1);
    annealer.setMaxTries(0);
    walk.proposals = 0;
    annealer.anneal(&walk, true);
    EXPECT_EQ(walk.proposals, 0);

    annealer.setStartTemperature(1e-6F);  // nothing is accepted but what lowers the energy
    annealer.setMaxTries(40);
    annealer.setMaxSuccesses(1);
    Walk frozen;
    frozen.at = 20;
    const LogCapture log;
    annealer.anneal(&frozen, false);
    EXPECT_EQ(std::tuple(frozen.proposals - frozen.lastMade, frozen.at, frozen.isChangePending()),
              std::tuple(40, 17, true));
    ASSERT_EQ(LogCapture::lines().size(), 2U * static_cast<size_t>(frozen.proposals));
    EXPECT_NE(LogCapture::lines().back().find(" \t 0.000000 \t 1.000000 \t 0 \t 0.000000 "), std::string::npos);
}

}  // namespace
