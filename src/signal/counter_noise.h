#ifndef QX_SIGNAL_COUNTER_NOISE_H
#define QX_SIGNAL_COUNTER_NOISE_H

#include "frame/views.h"
#include "signal/philox.h"

namespace qx {

// Noise in which each value has its own counters: x[i] depends only on the place, on i and on the
// parameters. Attempts of a rejection take the next counters of the same value.

// shape is above 0 and finite. G. Marsaglia and W. W. Tsang, "A simple method for generating gamma
// variables", 2000; for shape below 1, a value for shape + 1 is multiplied by a power of a uniform
// number.
void CounterGamma(RealVector x, double shape, const NoisePlace &place);

// mean from 0 to mostEvents. For a mean below 10 by summing probabilities, otherwise by the
// transformed rejection with squeeze of W. Hörmann, "The transformed rejection method for
// generating Poisson random variables", 1993, with the probabilities of C. Loader, "Fast and
// accurate computation of binomial probabilities", 2000, whose relative error does not grow with
// the mean.
inline constexpr double mostEvents = 1e15;
void CounterPoisson(RealVector x, double mean, const NoisePlace &place);

// trials is a whole number from 0 to mostTrials, p is from 0 to 1. The method is as above: W.
// Hörmann, "The generation of binomial random variates", 1993.
inline constexpr double mostTrials = 0x1p52;
void CounterBinomial(RealVector x, double trials, double p, const NoisePlace &place);

// A whole number from 0 to count - 1, all equally likely: D. Lemire, "Fast random integer
// generation in an interval", 2019. It uses the first word of the value's block, and rarely that of
// further attempts.
uint32_t CounterIndex(uint64_t bits, uint32_t count, const NoisePlace &place, uint64_t offset);

} // namespace qx

#endif
