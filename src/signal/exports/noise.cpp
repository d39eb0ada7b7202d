#include "signal/noise.h"

#include "frame/export.h"
#include "signal/random.h"

namespace qx {
namespace {

void SeedUnlessNegative(int32_t seed, RandomState &state) {
    if (seed >= 0)
        RandomSeed(seed, state);
}

Outcome White(Out<DBL1D> x, int32_t n, double amplitude, int32_t seed, RandomState *state) {
    if (n < 1)
        return ErrEmptyInput;
    if (const Outcome bad = x.resize(n))
        return bad;
    SeedUnlessNegative(seed, *state);
    UniformNoise(x.view(), amplitude, *state);
    return 0;
}

Outcome Gaussian(Out<DBL1D> x, int32_t n, double sigma, int32_t seed, RandomState *state,
                 GaussSpare *spare) {
    if (n < 1)
        return ErrEmptyInput;
    if (const Outcome bad = x.resize(n))
        return bad;
    if (seed > 0) {
        RandomSeed(seed, *state);
        spare->hasSpare = 0; // member by member: what lies between them stays
        spare->spare = 0.0;
    }
    GaussianNoise(x.view(), sigma, *state, *spare);
    return 0;
}

Outcome Periodic(int32_t n, double amplitude, int32_t seed, Out<DBL1D> x, RandomState *state) {
    if (n < 1)
        return ErrEmptyInput;
    if (const Outcome bad = x.resize(n))
        return bad;
    SeedUnlessNegative(seed, *state);
    return PeriodicNoise(x.view(), amplitude, *state);
}

// The frame of those whose parameters are checked ahead of the count.
template <class Array, class Generate>
Outcome Checked(Array &x, int32_t n, bool parametersAreGood, int32_t seed, RandomState *state,
                const Generate &generate) {
    if (const Outcome bad =
            FirstFailed({{!parametersAreGood, ErrInvalidSelector}, {n < 1, ErrEmptyInput}}))
        return bad;
    if (const Outcome bad = x.resize(n))
        return bad;
    SeedUnlessNegative(seed, *state);
    generate();
    return 0;
}

Outcome Gamma(Out<DBL1D> x, int32_t n, int32_t order, int32_t seed, RandomState *state) {
    return Checked(x, n, order >= 1, seed, state, [&] { GammaNoise(x.view(), order, *state); });
}

Outcome Poisson(Out<DBL1D> x, int32_t n, double mean, int32_t seed, RandomState *state) {
    return Checked(x, n, !(mean < 0.0), seed, state, [&] { PoissonNoise(x.view(), mean, *state); });
}

// A probability that is NaN would never be accepted.
Outcome Binomial(Out<U32_1D> x, int32_t n, int32_t trials, double p, int32_t seed,
                 RandomState *state, BinomialCache *cache) {
    return Checked(x, n, trials >= 0 && p >= 0.0 && p <= 1.0, seed, state,
                   [&] { BinomialNoise(x.view(), trials, p, *state, *cache); });
}

} // namespace
} // namespace qx

using qx::InErrAndReturnedWithHost;
using qx::InErrWithHost;
using qx::Returned;

int32_t white(DBL1D x, const int32_t *n, const double *amplitude, const int32_t *seed,
              ErrorCode *err, RandomState *state) {
    return InErrWithHost(err, qx::White, x, *n, *amplitude, *seed, state);
}

int32_t Gauss(DBL1D x, const int32_t *n, const double *sigma, const int32_t *seed, ErrorCode *err,
              RandomState *state, GaussSpare *spare) {
    return InErrWithHost(err, qx::Gaussian, x, *n, *sigma, *seed, state, spare);
}

int32_t PeriodNoise(const int32_t *n, const double *amplitude, const int32_t *seed, DBL1D x,
                    ErrorCode *err, RandomState *state) {
    return InErrAndReturnedWithHost(err, qx::Periodic, *n, *amplitude, *seed, x, state);
}

ErrorCode GammaNoiseH(DBL1D x, int32_t n, int32_t order, int32_t seed, RandomState *state) {
    return Returned(qx::Gamma, x, n, order, seed, state);
}

ErrorCode PoissonNoiseH(DBL1D x, int32_t n, double mean, int32_t seed, RandomState *state) {
    return Returned(qx::Poisson, x, n, mean, seed, state);
}

ErrorCode BinomialNoiseH(U32_1D x, int32_t n, int32_t trials, double p, int32_t seed,
                         RandomState *state, BinomialCache *cache) {
    return Returned(qx::Binomial, x, n, trials, p, seed, state, cache);
}
