#pragma once

#include <kplib/foundation/KpExport.h>

#include <cstdint>

class KpSimAnnState;

/// Simulated annealing: accepts each change that lowers the energy of a state. A change that
/// raises it is accepted with a probability that decreases with the rise and with falling
/// temperature. S. Kirkpatrick et al., "Optimization by simulated annealing", Science 220, 1983;
/// N. Metropolis et al., 1953.
class KPLIB_API KpSimulatedAnnealer {
public:
    /// The factor from one temperature to the next.
    void setCoolingFactor(float factor) { coolingFactor_ = factor; }
    /// The first temperature.
    void setStartTemperature(float temperature) { startTemperature_ = temperature; }
    /// The most proposals, and the most changes, at one temperature.
    void setMaxTries(int tries) { maxTries_ = tries; }
    /// The most changes at one temperature.
    void setMaxSuccesses(int successes) { maxSuccesses_ = successes; }
    /// The most temperatures.
    void setMaxTemperatureSteps(int steps) { maxTemperatureSteps_ = steps; }

    /// @{
    /// As it was set.
    float coolingFactor() const { return coolingFactor_; }
    float startTemperature() const { return startTemperature_; }
    int maxTries() const { return maxTries_; }
    int maxSuccesses() const { return maxSuccesses_; }
    int maxTemperatureSteps() const { return maxTemperatureSteps_; }
    /// @}

    /// Improves `state` in the caller's thread, until a temperature brings no change at all or the steps are used up.
    /// Unless `quiet`, each proposal writes two lines to the log, a heading each time.
    void anneal(KpSimAnnState* state, bool quiet) const;

private:
    float coolingFactor_ = 0.9F;
    float startTemperature_ = 1;
    std::int32_t maxTries_ = 1000;
    std::int32_t maxSuccesses_ = 100;
    std::int32_t maxTemperatureSteps_ = 100;
};
