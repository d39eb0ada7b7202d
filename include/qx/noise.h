#ifndef QX_NOISE_H
#define QX_NOISE_H

/* Noise from the uniform generator of B. A. Wichmann and I. D. Hill, "Algorithm AS 183: An
   efficient and portable pseudo-random number generator", 1982: three congruential sequences
   whose sum, without its whole part, is the number u in [0, 1).

   The caller owns the state of the stream. A seed above 0 restarts it, so that the same seed gives
   the same samples; 0 and negative seeds go on with it, and blocks then join as if they had been
   one. A state of zeros stands still: noise without an end to its draws (Gauss, GammaNoiseH from
   order 6) is then 0.

   Seeds say little: s1 is the seed, s2 and s3 come from its remainder by 16384 alone. A multiple of
   16384 leaves s2 and s3 at 0: u is then a multiple of 1/30269 and repeats after 30268 numbers, and
   for the multiples 1 to 4 of 47333376 all u are 0. Streams of different seeds are not independent.
   Where s is odd and its remainder is below 8192, each u of the seed 2 s is the fractional part of
   twice that of s, and the two have a correlation of 0.5. For streams side by side, go on with one
   state, or take states from elsewhere than from seeds.

   The state also advances where a sample needs several draws, so it tells nothing about the number
   of samples.

   The noise of 2026 has no state. It comes from the counter-based generator Philox4x32-10: J. K.
   Salmon, M. A. Moraes, R. O. Dror and D. E. Shaw, "Parallel random numbers: as easy as 1, 2, 3",
   2011. Sample i of a call is a function of key, stream, position + i, the kind of noise and its
   parameters alone: any place is reached at once, blocks join as if they had been one, and samples
   may be made in any order and in any threads. Key and stream are any numbers; each pair gives a
   sequence of its own of 2^53 samples, and so does each kind of noise. The position is a whole
   number from 0 to 2^53 - n. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* The state of a stream, one number per sequence: s1 = 171 s1 mod 30269, s2 = 172 s2 mod 30307,
   s3 = 170 s3 mod 30323 with each number drawn. */
typedef struct RandomState {
    int32_t s1;
    int32_t s2;
    int32_t s3;
} RandomState;

/* Gaussian numbers arise in pairs; here the second waits for the next call, for sigma = 1. */
typedef struct GaussSpare {
    int32_t hasSpare;
    double spare;
} GaussSpare;

/* What BinomialNoiseH keeps between calls, so that it computes it only where its arguments have
   changed; zeros at first. With q = min(p, 1 - p): pOld = q, pc = 1 - q and their logarithms;
   enOld = nOld = trials and ln Gamma(trials + 1). */
typedef struct BinomialCache {
    double pOld;
    double pc;
    double logP;
    double logPc;
    double enOld;
    double lnGammaEn1;
    int32_t nOld;
} BinomialCache;

/** Uniform white noise: x[i] = (u - 0.5) (2 amplitude), *n samples in [-amplitude, amplitude). The
    function result is 0, or the host's status where it refused the resize. Sequences of some seeds
    have a correlation of 0.5; those of White2026 have none.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: amplitude in all results. */
QX_API int32_t white(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amplitude,
                     QX_IN const int32_t *seed, QX_OUT ErrorCode *err, QX_INOUT RandomState *state);

/** Gaussian white noise of mean 0 and standard deviation *sigma, by the polar method: G. Marsaglia
    and T. A. Bray, "A convenient method for generating normal variables", 1964. Numbers come in
    pairs and the second of a pair is kept in `spare`, unscaled, for the next sample or the next
    call; a seed above 0 forgets it. Seeds are related as those of white are; those of Gauss2026
    are not. The function result is 0, or the host's status where it refused the resize.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: sigma in all results; spare.spare in some results or in no result. */
QX_API int32_t Gauss(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *sigma,
                     QX_IN const int32_t *seed, QX_OUT ErrorCode *err, QX_INOUT RandomState *state,
                     QX_INOUT GaussSpare *spare);

/** One period of a sum of cosines at 1, 2, ... (n-1)/2 cycles, each of amplitude *amplitude, with
    random phases: noise whose spectrum is flat over whole numbers of periods. The phases are
    integers from 0 to 32767, taken as radians. Where *n *amplitude overflows all samples are NaN.
    The code stands in *err and is the function result, which is the host's status instead where it
    refused the resize.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (no memory).
    NaN: amplitude in all results. */
QX_API int32_t PeriodNoise(QX_IN const int32_t *n, QX_IN const double *amplitude,
                           QX_IN const int32_t *seed, QX_OUT DBL1D x, QX_OUT ErrorCode *err,
                           QX_INOUT RandomState *state);

/** Gamma noise: waiting times for `order` events of a Poisson process of rate 1; mean and variance
    are `order`. Gamma2026 has any shape, and seeds that are not related. Up to order 5 minus the
    logarithm of a product of `order` uniform numbers, above by rejection from a Lorentzian: J. H.
    Ahrens and U. Dieter, "Computer methods for sampling from gamma, beta, Poisson and binomial
    distributions", 1974.
    Codes: ErrInvalidSelector (the order is below 1), ErrEmptyInput (n is below 1), ErrOutOfMemory
    (the host refused the resize). */
QX_API ErrorCode GammaNoiseH(QX_OUT DBL1D x, int32_t n, int32_t order, int32_t seed,
                             QX_INOUT RandomState *state);

/** Poisson noise: numbers of events, of the given mean. Below a mean of 12 by counting the factors
    of a product of uniform numbers, from there on by rejection from a Lorentzian. A mean that is
    not finite gives NaN. The rejection loses its digits where the mean is large: the standard
    deviation comes out 2.5 % too large at a mean of 1e14, 10 % at 1e15, 2.9 times at 1e16, and
    beyond that the numbers are no Poisson noise, near 1e308 infinite; Poisson2026 is exact to a
    mean of 1e15.
    Codes: ErrInvalidSelector (the mean is negative), ErrEmptyInput (n is below 1), ErrOutOfMemory
    (the host refused the resize).
    NaN: mean in all results. */
QX_API ErrorCode PoissonNoiseH(QX_OUT DBL1D x, int32_t n, double mean, int32_t seed,
                               QX_INOUT RandomState *state);

/** Binomial noise: numbers of successes in `trials` trials of probability p. Below 25 trials they
    are carried out; where min(p, 1 - p) trials is below 1 the successes are counted as Poisson
    events; otherwise by rejection from a Lorentzian. Binomial2026 takes 2^52 trials, and this one
    2^31 - 1.
    Codes: ErrInvalidSelector (trials is negative, or p does not lie in 0 to 1), ErrEmptyInput (n is
    below 1), ErrOutOfMemory (the host refused the resize).
    NaN: p refused with ErrInvalidSelector; cache.enOld, cache.lnGammaEn1, cache.logP, cache.logPc,
    cache.pOld, cache.pc in no result. */
QX_API ErrorCode BinomialNoiseH(QX_OUT U32_1D x, int32_t n, int32_t trials, double p, int32_t seed,
                                QX_INOUT RandomState *state, QX_INOUT BinomialCache *cache);

/** Uniform white noise: x[i] = amplitude (2 u - 1), n samples in (-amplitude, amplitude); u is
    (m + 1/2) / 2^52 with m of 52 bits, so that the samples are symmetric and none is 0.
    Codes: ErrEmptyInput (n is below 1), ErrIndexOutOfRange (the position is negative, no whole
    number, or above 2^53 - n), ErrOutOfMemory (the host refused the resize).
    NaN: amplitude in all results; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode White2026(QX_OUT DBL1D x, int32_t n, double amplitude, int32_t key, int32_t stream,
                           double position);
/** Gaussian white noise of mean 0 and standard deviation sigma: the quantile of a uniform number,
    one sample to one block, by M. J. Wichura, "Algorithm AS 241: The percentage points of the
    normal distribution", 1988, to 1e-15 of itself. A tail below 2^-12 has 64 bits more, so that
    samples beyond 8.2 sigma occur as often as they should, to 12.5 sigma.
    Codes: ErrEmptyInput (n is below 1), ErrIndexOutOfRange (the position is negative, no whole
    number, or above 2^53 - n), ErrOutOfMemory (the host refused the resize).
    NaN: sigma in all results; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode Gauss2026(QX_OUT DBL1D x, int32_t n, double sigma, int32_t key, int32_t stream,
                           double position);
/** Gamma noise of any shape above 0, with density x^(shape - 1) exp(-x) / Gamma(shape): by
    rejection, G. Marsaglia and W. W. Tsang, "A simple method for generating gamma variables",
    2000. Below a shape of 0.002 some samples underflow to 0.
    Codes: ErrInvalidSelector (the shape is not above 0, or not finite), ErrEmptyInput (n is below
    1), ErrIndexOutOfRange (the position is negative, no whole number, or above 2^53 - n),
    ErrOutOfMemory (the host refused the resize).
    NaN: shape refused with ErrInvalidSelector; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode Gamma2026(QX_OUT DBL1D x, int32_t n, double shape, int32_t key, int32_t stream,
                           double position);
/** Poisson noise of means to 1e15: below a mean of 10 by the sum of probabilities, above by
    rejection, W. Hoermann, "The transformed rejection method for generating Poisson random
    variables", 1993, with probabilities as of C. Loader, "Fast and accurate computation of
    binomial probabilities", 2000, which keep their digits at any mean.
    Codes: ErrInvalidSelector (the mean is not from 0 to 1e15), ErrEmptyInput (n is below 1),
    ErrIndexOutOfRange (the position is negative, no whole number, or above 2^53 - n),
    ErrOutOfMemory (the host refused the resize).
    NaN: mean refused with ErrInvalidSelector; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode Poisson2026(QX_OUT DBL1D x, int32_t n, double mean, int32_t key, int32_t stream,
                             double position);
/** Binomial noise: numbers of successes in `trials` trials of probability p, trials a whole number
    to 2^52. As Poisson2026 otherwise: W. Hoermann, "The generation of binomial random variates",
    1993.
    Codes: ErrInvalidSelector (trials is not a whole number of 0 to 2^52, or p is not from 0 to 1),
    ErrEmptyInput (n is below 1), ErrIndexOutOfRange (the position is negative, no whole number, or
    above 2^53 - n), ErrOutOfMemory (the host refused the resize).
    NaN: trials, p refused with ErrInvalidSelector; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode Binomial2026(QX_OUT DBL1D x, int32_t n, double trials, double p, int32_t key,
                              int32_t stream, double position);

QX_END_DECLS

#endif
