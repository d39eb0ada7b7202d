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
   of samples. */

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
    function result is 0, or the host's status where it refused the resize.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: amplitude in all results. */
QX_API int32_t white(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amplitude,
                     QX_IN const int32_t *seed, QX_OUT ErrorCode *err, QX_INOUT RandomState *state);

/** Gaussian white noise of mean 0 and standard deviation *sigma, by the polar method: G. Marsaglia
    and T. A. Bray, "A convenient method for generating normal variables", 1964. Numbers come in
    pairs and the second of a pair is kept in `spare`, unscaled, for the next sample or the next
    call; a seed above 0 forgets it. The function result is 0, or the host's status where it refused
    the resize.
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
    are `order`. Up to order 5 minus the logarithm of a product of `order` uniform numbers, above by
    rejection from a Lorentzian: J. H. Ahrens and U. Dieter, "Computer methods for sampling from
    gamma, beta, Poisson and binomial distributions", 1974.
    Codes: ErrInvalidSelector (the order is below 1), ErrEmptyInput (n is below 1), ErrOutOfMemory
    (the host refused the resize). */
QX_API ErrorCode GammaNoiseH(QX_OUT DBL1D x, int32_t n, int32_t order, int32_t seed,
                             QX_INOUT RandomState *state);

/** Poisson noise: numbers of events, of the given mean. Below a mean of 12 by counting the factors
    of a product of uniform numbers, from there on by rejection from a Lorentzian. A mean that is
    not finite gives NaN. The rejection loses its digits where the mean is large: the standard
    deviation comes out 2.5 % too large at a mean of 1e14, 10 % at 1e15, 2.9 times at 1e16, and
    beyond that the numbers are no Poisson noise, near 1e308 infinite.
    Codes: ErrInvalidSelector (the mean is negative), ErrEmptyInput (n is below 1), ErrOutOfMemory
    (the host refused the resize).
    NaN: mean in all results. */
QX_API ErrorCode PoissonNoiseH(QX_OUT DBL1D x, int32_t n, double mean, int32_t seed,
                               QX_INOUT RandomState *state);

/** Binomial noise: numbers of successes in `trials` trials of probability p. Below 25 trials they
    are carried out; where min(p, 1 - p) trials is below 1 the successes are counted as Poisson
    events; otherwise by rejection from a Lorentzian.
    Codes: ErrInvalidSelector (trials is negative, or p does not lie in 0 to 1), ErrEmptyInput (n is
    below 1), ErrOutOfMemory (the host refused the resize).
    NaN: p refused with ErrInvalidSelector; cache.enOld, cache.lnGammaEn1, cache.logP, cache.logPc,
    cache.pOld, cache.pc in no result. */
QX_API ErrorCode BinomialNoiseH(QX_OUT U32_1D x, int32_t n, int32_t trials, double p, int32_t seed,
                                QX_INOUT RandomState *state, QX_INOUT BinomialCache *cache);

QX_END_DECLS

#endif
