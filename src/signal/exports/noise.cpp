#include "signal/noise.h"

#include "frame/export.h"
#include "signal/counter_noise.h"
#include "signal/random.h"

#include <cmath>

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
        spare->hasSpare = 0; // member by member: the bytes between them are left unchanged
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

// The frame of the exports whose parameters are checked before the count.
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

// With a NaN probability nothing would ever be accepted.
Outcome Binomial(Out<U32_1D> x, int32_t n, int32_t trials, double p, int32_t seed,
                 RandomState *state, BinomialCache *cache) {
    return Checked(x, n, trials >= 0 && p >= 0.0 && p <= 1.0, seed, state,
                   [&] { BinomialNoise(x.view(), trials, p, *state, *cache); });
}

// Where the noise of 2026 begins; the position is a whole number.
struct Start {
    int32_t key, stream;
    double position;
};

constexpr double mostPosition = 0x1p53;

// `fill` is called with the place.
template <class Fill>
Outcome Counted(Out<DBL1D> &x, int32_t n, const Start &start, NoiseKind kind,
                bool parametersAreGood, const Fill &fill) {
    const auto &[key, stream, position] = start;
    if (const Outcome bad = FirstFailed({{!parametersAreGood, ErrInvalidSelector},
                                         {n < 1, ErrEmptyInput},
                                         {!(position >= 0.0 && position <= mostPosition - n &&
                                            position == std::floor(position)),
                                          ErrIndexOutOfRange}}))
        return bad;
    if (const Outcome bad = x.resize(n))
        return bad;
    fill(NoisePlace{key, stream, static_cast<uint64_t>(position), kind});
    return 0;
}

Outcome CounterWhiteNoise(Out<DBL1D> x, int32_t n, double amplitude, Start start) {
    return Counted(x, n, start, NoiseKind::Uniform, true,
                   [&](const NoisePlace &place) { PhiloxUniforms(place, amplitude, x.data(), n); });
}

Outcome CounterGaussNoise(Out<DBL1D> x, int32_t n, double sigma, Start start) {
    return Counted(x, n, start, NoiseKind::Gaussian, true,
                   [&](const NoisePlace &place) { PhiloxGaussians(place, sigma, x.data(), n); });
}

Outcome CounterGammaNoise(Out<DBL1D> x, int32_t n, double shape, Start start) {
    return Counted(x, n, start, NoiseKind::Gamma, shape > 0.0 && std::isfinite(shape),
                   [&](const NoisePlace &place) { CounterGamma(x.view(), shape, place); });
}

Outcome CounterPoissonNoise(Out<DBL1D> x, int32_t n, double mean, Start start) {
    return Counted(x, n, start, NoiseKind::Poisson, mean >= 0.0 && mean <= mostEvents,
                   [&](const NoisePlace &place) { CounterPoisson(x.view(), mean, place); });
}

Outcome CounterBinomialNoise(Out<DBL1D> x, int32_t n, double trials, double p, Start start) {
    const bool areGood = trials >= 0.0 && trials <= mostTrials && trials == std::floor(trials) &&
                         p >= 0.0 && p <= 1.0;
    return Counted(x, n, start, NoiseKind::Binomial, areGood,
                   [&](const NoisePlace &place) { CounterBinomial(x.view(), trials, p, place); });
}

} // namespace
} // namespace qx

using qx::InErrAndReturnedWithHost;
using qx::InErrWithHost;
using qx::Returned;
using qx::Start;

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

ErrorCode White2026(DBL1D x, int32_t n, double amplitude, int32_t key, int32_t stream,
                    double position) {
    return Returned(qx::CounterWhiteNoise, x, n, amplitude, Start{key, stream, position});
}

ErrorCode Gauss2026(DBL1D x, int32_t n, double sigma, int32_t key, int32_t stream,
                    double position) {
    return Returned(qx::CounterGaussNoise, x, n, sigma, Start{key, stream, position});
}

ErrorCode Gamma2026(DBL1D x, int32_t n, double shape, int32_t key, int32_t stream,
                    double position) {
    return Returned(qx::CounterGammaNoise, x, n, shape, Start{key, stream, position});
}

ErrorCode Poisson2026(DBL1D x, int32_t n, double mean, int32_t key, int32_t stream,
                      double position) {
    return Returned(qx::CounterPoissonNoise, x, n, mean, Start{key, stream, position});
}

ErrorCode Binomial2026(DBL1D x, int32_t n, double trials, double p, int32_t key, int32_t stream,
                       double position) {
    return Returned(qx::CounterBinomialNoise, x, n, trials, p, Start{key, stream, position});
}
