#ifndef QX_NOISE_H
#define QX_NOISE_H

/* Random noise. The original exports use the uniform generator of B. A. Wichmann and I. D. Hill,
   "Algorithm AS 183: An efficient and portable pseudo-random number generator", 1982: the
   fractional part of the sum of three congruential sequences is the number u in [0, 1).

   The caller owns the state of the stream. A seed above 0 restarts it, so that the same seed gives
   the same samples; 0 and negative seeds continue it, and consecutive blocks are then the same as a
   single block. A state of zeros never changes: noise whose number of draws is not bounded (Gauss,
   GammaNoiseH from order 6) is then 0.

   Seeds are a weak way to choose a stream: s1 is the seed, and s2 and s3 depend only on its
   remainder modulo 16384. For a multiple of 16384 s2 and s3 are 0: u is then a multiple of 1/30269
   and repeats after 30268 numbers, and for the multiples 1 to 4 of 47333376 all u are 0. Streams of
   different seeds are not independent. If a seed s is odd and its remainder is below 8192, each u
   of the seed 2 s is the fractional part of twice that of s, and the two streams have a correlation
   of 0.5. For parallel streams, continue a single state, or set the states directly.

   The state advances several times if a sample needs several draws, so it does not determine the
   number of samples.

   The 2026 revisions have no state. They use the counter-based generator Philox4x32-10: J. K.
   Salmon, M. A. Moraes, R. O. Dror and D. E. Shaw, "Parallel random numbers: as easy as 1, 2, 3",
   2011. Sample i of a call depends only on key, stream, position + i, the kind of noise and its
   parameters. Any position is reached directly, consecutive blocks are the same as a single block,
   and samples may be computed in any order and in any threads. Key and stream are any numbers; each
   pair, and each kind of noise, gives its own sequence of 2^53 samples. The position is an integer
   from 0 to 2^53 - n. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* The state of a stream, one number per sequence: s1 = 171 s1 mod 30269, s2 = 172 s2 mod 30307,
   s3 = 170 s3 mod 30323 with each number drawn. */
typedef struct RandomState {
    int32_t s1;
    int32_t s2;
    int32_t s3;
} RandomState;

/* Gaussian numbers are generated in pairs; this holds the second number, for sigma = 1, for the
   next call. */
typedef struct GaussSpare {
    int32_t hasSpare;
    double spare;
} GaussSpare;

/* Values that BinomialNoiseH keeps between calls and recomputes only if its arguments change; zeros
   at first. With q = min(p, 1 - p): pOld = q, pc = 1 - q and their logarithms; enOld = nOld =
   trials and ln Gamma(trials + 1). */
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
    function result is 0, or the host's status if it refused the resize. Sequences of some seeds
    have a correlation of 0.5; those of White2026 are uncorrelated.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: amplitude in all results. */
QX_API int32_t white(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amplitude,
                     QX_IN const int32_t *seed, QX_OUT ErrorCode *err, QX_INOUT RandomState *state);

/** Gaussian white noise of mean 0 and standard deviation *sigma, by the polar method: G. Marsaglia
    and T. A. Bray, "A convenient method for generating normal variables", 1964. Numbers are
    generated in pairs, and the second of a pair is kept in `spare`, unscaled, for the next sample
    or the next call; a seed above 0 discards it. Sequences of different seeds are related, as in
    white; those of Gauss2026 are not. The function result is 0, or the host's status if it refused
    the resize.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: sigma in all results; spare.spare in some results or in no result. */
QX_API int32_t Gauss(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *sigma,
                     QX_IN const int32_t *seed, QX_OUT ErrorCode *err, QX_INOUT RandomState *state,
                     QX_INOUT GaussSpare *spare);

/** One period of a sum of cosines at 1, 2, ... (n-1)/2 cycles, each of amplitude *amplitude, with
    random phases: noise with a flat spectrum over whole numbers of periods. The phases are integers
    from 0 to 32767, in radians. If *n *amplitude overflows, all samples are NaN. The code is in
    *err and is the function result; if the host refused the resize, the function result is the
    host's status instead.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (no memory).
    NaN: amplitude in all results. */
QX_API int32_t PeriodNoise(QX_IN const int32_t *n, QX_IN const double *amplitude,
                           QX_IN const int32_t *seed, QX_OUT DBL1D x, QX_OUT ErrorCode *err,
                           QX_INOUT RandomState *state);

/** Gamma noise: waiting times for `order` events of a Poisson process of rate 1; mean and variance
    are `order`. Gamma2026 accepts any shape, and its sequences are not related. Up to order 5 a
    sample is minus the logarithm of a product of `order` uniform numbers; above, it is found by
    rejection from a Lorentzian: J. H. Ahrens and U. Dieter, "Computer methods for sampling from
    gamma, beta, Poisson and binomial distributions", 1974.
    Codes: ErrInvalidSelector (the order is below 1), ErrEmptyInput (n is below 1), ErrOutOfMemory
    (the host refused the resize). */
QX_API ErrorCode GammaNoiseH(QX_OUT DBL1D x, int32_t n, int32_t order, int32_t seed,
                             QX_INOUT RandomState *state);

/** Poisson noise: numbers of events with the given mean. Below a mean of 12 they are found by
    counting the factors of a product of uniform numbers, otherwise by rejection from a Lorentzian.
    A mean that is not finite gives NaN. The rejection loses accuracy if the mean is large: the
    standard deviation is too large by 2.5 % at a mean of 1e14, by 10 % at 1e15, and by a factor of
    2.9 at 1e16; beyond that the numbers are not Poisson noise, and near 1e308 they are infinite.
    Poisson2026 is exact up to a mean of 1e15.
    Codes: ErrInvalidSelector (the mean is negative), ErrEmptyInput (n is below 1), ErrOutOfMemory
    (the host refused the resize).
    NaN: mean in all results. */
QX_API ErrorCode PoissonNoiseH(QX_OUT DBL1D x, int32_t n, double mean, int32_t seed,
                               QX_INOUT RandomState *state);

/** Binomial noise: numbers of successes in `trials` trials of probability p. Below 25 trials each
    trial is simulated; if min(p, 1 - p) trials is below 1, the successes are counted as Poisson
    events; otherwise the method is rejection from a Lorentzian. The maximum is 2^31 - 1 trials here
    and 2^52 in Binomial2026.
    Codes: ErrInvalidSelector (trials is negative, or p is not in 0 to 1), ErrEmptyInput (n is below
    1), ErrOutOfMemory (the host refused the resize).
    NaN: p refused with ErrInvalidSelector; cache.enOld, cache.lnGammaEn1, cache.logP, cache.logPc,
    cache.pOld, cache.pc in no result. */
QX_API ErrorCode BinomialNoiseH(QX_OUT U32_1D x, int32_t n, int32_t trials, double p, int32_t seed,
                                QX_INOUT RandomState *state, QX_INOUT BinomialCache *cache);

/** Uniform white noise: x[i] = amplitude (2 u - 1), n samples in (-amplitude, amplitude); u is
    (m + 1/2) / 2^52 with m of 52 bits, so that the samples are symmetric and never 0.
    Codes: ErrEmptyInput (n is below 1), ErrIndexOutOfRange (the position is negative, not a whole
    number, or above 2^53 - n), ErrOutOfMemory (the host refused the resize).
    NaN: amplitude in all results; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode White2026(QX_OUT DBL1D x, int32_t n, double amplitude, int32_t key, int32_t stream,
                           double position);
/** Gaussian white noise of mean 0 and standard deviation sigma: the quantile of a uniform number,
    one generator block per sample, by M. J. Wichura, "Algorithm AS 241: The percentage points of
    the normal distribution", 1988, with a relative error of 1e-15. Tail probabilities below 2^-12
    have 64 additional bits, so that samples beyond 8.2 sigma occur with the correct frequency, up
    to 12.5 sigma.
    Codes: ErrEmptyInput (n is below 1), ErrIndexOutOfRange (the position is negative, not a whole
    number, or above 2^53 - n), ErrOutOfMemory (the host refused the resize).
    NaN: sigma in all results; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode Gauss2026(QX_OUT DBL1D x, int32_t n, double sigma, int32_t key, int32_t stream,
                           double position);
/** Gamma noise of any shape above 0, with density x^(shape - 1) exp(-x) / Gamma(shape), by
    rejection: G. Marsaglia and W. W. Tsang, "A simple method for generating gamma variables", 2000.
    Below a shape of 0.002 some samples underflow to 0.
    Codes: ErrInvalidSelector (the shape is not above 0, or not finite), ErrEmptyInput (n is below
    1), ErrIndexOutOfRange (the position is negative, not a whole number, or above 2^53 - n),
    ErrOutOfMemory (the host refused the resize).
    NaN: shape refused with ErrInvalidSelector; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode Gamma2026(QX_OUT DBL1D x, int32_t n, double shape, int32_t key, int32_t stream,
                           double position);
/** Poisson noise with means up to 1e15: below a mean of 10 by summing probabilities, otherwise by
    rejection, W. Hoermann, "The transformed rejection method for generating Poisson random
    variables", 1993, with probabilities as in C. Loader, "Fast and accurate computation of binomial
    probabilities", 2000, which are accurate at any mean.
    Codes: ErrInvalidSelector (the mean is not from 0 to 1e15), ErrEmptyInput (n is below 1),
    ErrIndexOutOfRange (the position is negative, not a whole number, or above 2^53 - n),
    ErrOutOfMemory (the host refused the resize).
    NaN: mean refused with ErrInvalidSelector; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode Poisson2026(QX_OUT DBL1D x, int32_t n, double mean, int32_t key, int32_t stream,
                             double position);
/** Binomial noise: numbers of successes in `trials` trials of probability p, where trials is an
    integer up to 2^52. Otherwise as Poisson2026; the rejection is that of W. Hoermann, "The
    generation of binomial random variates", 1993.
    Codes: ErrInvalidSelector (trials is not a whole number from 0 to 2^52, or p is not in 0 to 1),
    ErrEmptyInput (n is below 1), ErrIndexOutOfRange (the position is negative, not a whole number,
    or above 2^53 - n), ErrOutOfMemory (the host refused the resize).
    NaN: trials, p refused with ErrInvalidSelector; position refused with ErrIndexOutOfRange. */
QX_API ErrorCode Binomial2026(QX_OUT DBL1D x, int32_t n, double trials, double p, int32_t key,
                              int32_t stream, double position);

QX_END_DECLS

#endif
