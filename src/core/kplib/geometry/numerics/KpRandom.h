#pragma once

#include <kplib/foundation/KpExport.h>

#include <cstdint>

/// A portable generator of uniform numbers: the minimal standard generator (a = 16807, m = 2^31 - 1), its low-order
/// correlations removed by a shuffle through 32 entries. The same seed gives the same numbers on every machine.
///
/// S. K. Park and K. W. Miller, "Random number generators: good ones are hard to find", CACM 31(10), 1988; C. Bays and
/// S. D. Durham, "Improving a poor random number generator", ACM TOMS 2(1), 1976. Not for secrets.
class KPLIB_API KpRandom {
public:
    /// As initialize().
    explicit KpRandom(std::int64_t seed = 1) { initialize(seed); }

    /// Starts the sequence of `seed`; 0 counts as 1. Any other multiple of 2^31 - 1 is a fixed
    /// point of the generator: all numbers are then 0.
    void initialize(std::int64_t seed);

    /// The next number of this object's sequence, above 0 and at most 0.99999988. Threads that
    /// call it at the same time may get the same numbers, with no other effect.
    double next();

    /// As next(), from one generator for the whole process, which the first call seeds from the clock.
    static double rand();

    /// The state of the minimal standard generator.
    std::int64_t idum() const { return idum_; }

private:
    std::int64_t step();

    std::int64_t idum_;
    std::int64_t iy_;      // the number given last: it chooses the next entry
    std::int64_t iv_[32];  // the shuffle
};
