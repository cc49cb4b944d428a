#include <kplib/geometry/numerics/KpSimulatedAnnealer.h>

#include <kplib/geometry/numerics/KpRandom.h>
#include <kplib/geometry/numerics/KpSimAnnState.h>
#include <kplib/log/KpLogFile.h>

#include <cmath>

void KpSimulatedAnnealer::anneal(KpSimAnnState* state, bool quiet) const
{
    float energy = state->evaluate();
    float temperature = startTemperature_;
    for (int step = 0; step < maxTemperatureSteps_ && maxTries_ > 0; ++step) {
        int tries = 0, successes = 0;
        do {
            const float change = state->suggestChange();
            const double chance = std::exp(static_cast<double>(-change / temperature));
            if (!quiet) {
                getTheLogInstance().printf("#T \t energy \t delta_e \t nsucc \t exp(-de/t) \n");
                getTheLogInstance().printf("%f \t %f \t %f \t %d \t %f \n", static_cast<double>(temperature),
                                           static_cast<double>(energy), static_cast<double>(change), successes, chance);
            }
            if (change < 0 || chance > KpRandom::rand()) {
                energy += change;
                state->executeChange();
                ++successes;
            }
            ++tries;
        } while (successes < maxSuccesses_ && tries < maxTries_);
        if (successes == 0)
            return;
        temperature *= coolingFactor_;
    }
}
