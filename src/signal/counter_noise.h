#ifndef QX_SIGNAL_COUNTER_NOISE_H
#define QX_SIGNAL_COUNTER_NOISE_H

#include "frame/views.h"
#include "signal/philox.h"

namespace qx {

// Noise whose every value has counters of its own: x[i] depends on the place, on i and on the
// parameters alone. Attempts of a rejection take the next counters of the same value.

// shape > 0, finite. G. Marsaglia and W. W. Tsang, "A simple method for generating gamma
// variables", 2000; below 1 by a value of shape + 1 times a power of a uniform number.
void CounterGamma(RealVector x, double shape, const NoisePlace &place);

// mean from 0 to mostEvents. Below 10 by the sum of probabilities, from there on by the transformed
// rejection with squeeze of W. Hörmann, "The transformed rejection method for generating Poisson
// random variables", 1993, with probabilities as of C. Loader, "Fast and accurate computation of
// binomial probabilities", 2000, whose relative error does not grow with the mean.
inline constexpr double mostEvents = 1e15;
void CounterPoisson(RealVector x, double mean, const NoisePlace &place);

// trials whole, from 0 to mostTrials, p from 0 to 1. As above: W. Hörmann, "The generation of
// binomial random variates", 1993.
inline constexpr double mostTrials = 0x1p52;
void CounterBinomial(RealVector x, double trials, double p, const NoisePlace &place);

// A whole number of 0 to count - 1, all equally likely: D. Lemire, "Fast random integer generation
// in an interval", 2019. From the first word of the value's block, seldom of further attempts.
uint32_t CounterIndex(uint64_t bits, uint32_t count, const NoisePlace &place, uint64_t offset);

} // namespace qx

#endif
