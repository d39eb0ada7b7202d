#include "qx/qx.h"
#include "signal/philox.h"
#include "signal/random.h"
#include "special/gamma.h"
#include "tests/support/hostile_host.h"
#include "tests/support/table.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <functional>
#include <limits>
#include <map>
#include <numbers>
#include <numeric>
#include <vector>

namespace qx::test {
namespace {

using U32Array = Array1D<qx::ElementType::U32>;
typedef std::vector<double> Samples;

const RandomState start = {123, 4567, 89};

Samples White(int32_t n, int32_t seed, RandomState &state, double amplitude = 0.5) {
    DBLArray x;
    ErrorCode err = 1;
    EXPECT_EQ(white(x.handle(), &n, &amplitude, &seed, &err, &state), 0);
    EXPECT_EQ(err, 0);
    return x.values();
}
Samples Gaussian(int32_t n, int32_t seed, RandomState &state, GaussSpare &spare,
                 double sigma = 1.0) {
    DBLArray x;
    ErrorCode err = 1;
    EXPECT_EQ(Gauss(x.handle(), &n, &sigma, &seed, &err, &state, &spare), 0);
    EXPECT_EQ(err, 0);
    return x.values();
}
Samples Gamma(int32_t n, int32_t order, int32_t seed, RandomState &state) {
    DBLArray x;
    EXPECT_EQ(GammaNoiseH(x.handle(), n, order, seed, &state), 0);
    return x.values();
}
Samples Poisson(int32_t n, double mean, int32_t seed, RandomState &state) {
    DBLArray x;
    EXPECT_EQ(PoissonNoiseH(x.handle(), n, mean, seed, &state), 0);
    return x.values();
}
Samples Binomial(int32_t n, int32_t trials, double p, int32_t seed, RandomState &state,
                 BinomialCache &cache) {
    U32Array x;
    EXPECT_EQ(BinomialNoiseH(x.handle(), n, trials, p, seed, &state, &cache), 0);
    const auto values = x.values();
    return Samples(values.begin(), values.end());
}

// The three sequences are equivalent to one: H. Zeisel, "Remark ASR 61: A remark on algorithm AS
// 183", 1986.
class OneSequence {
public:
    explicit OneSequence(const RandomState &s)
        : x_((int64_t{s.s1} * 30307 * 30323 + int64_t{s.s2} * 30269 * 30323 +
              int64_t{s.s3} * 30269 * 30307) %
             modulus) {}
    long double next() {
        int64_t product = 0; // multiplies by 15 bits of the factor at a time
        for (const int64_t digit : {15418, 14459, 29746})
            product = ((product << 15) + digit * x_) % modulus;
        x_ = product;
        return static_cast<long double>(x_) / modulus;
    }

private:
    static constexpr int64_t modulus = 27817185604309;
    static_assert((((int64_t{15418} << 15) + 14459) << 15) + 29746 == 16555425264690);
    int64_t x_;
};

TEST(UniformNumbers, AreThePublishedSequence) {
    for (const int32_t seed : {1, 2, 4711, 30268, 1000000}) {
        RandomState state = {0, 0, 0};
        qx::RandomSeed(seed, state);
        OneSequence exact({seed % 30269, state.s2, state.s3});
        const Samples u = White(5000, seed, state);
        for (const double value : u)
            ASSERT_NEAR(value + 0.5, static_cast<double>(exact.next()), 1.2e-15) << seed;
    }
    RandomState state = start;
    OneSequence exact(state);
    for (int i = 0; i < 5000; ++i)
        ASSERT_EQ(qx::RandomInt15(state), static_cast<int32_t>(32768 * exact.next()));
}

TEST(UniformNumbers, SeedsFillTheState) {
    RandomState state = start;
    qx::RandomSeed(0, state);
    EXPECT_EQ(state.s1, start.s1) << "a seed of 0 does nothing";
    qx::RandomSeed(1, state);
    EXPECT_EQ(state.s1, 1);
    EXPECT_EQ(state.s2, 8191);
    EXPECT_EQ(state.s3, 1);
    qx::RandomSeed(-3, state);
    EXPECT_EQ(state.s1, -3);
    EXPECT_EQ(state.s2, 2 * 16384 - 3 * 8191);
}

TEST(UniformNumbers, SeedsMakeStreamsThatDependOnEachOther) {
    RandomState state = {};
    const auto numbers = [&](int32_t seed) { return White(30300, seed, state); };
    const Samples few = numbers(3 * 16384);
    for (std::size_t i = 0; i < few.size(); ++i) {
        const double multiple = (few[i] + 0.5) * 30269;
        ASSERT_NEAR(multiple, std::round(multiple), 1e-10);
        if (i >= 30268) {
            ASSERT_EQ(few[i], few[i - 30268]);
        }
    }
    for (const int32_t seed : {7, 8191, 1000003}) {
        const Samples once = numbers(seed), twice = numbers(2 * seed);
        for (std::size_t i = 0; i < once.size(); ++i) {
            const double distance = twice[i] + 0.5 - 2 * (once[i] + 0.5);
            ASSERT_NEAR(distance, std::round(distance), 1e-14) << seed;
        }
    }
    for (int32_t k = 1; k <= 4; ++k)
        EXPECT_EQ(numbers(k * 47333376)[1], -0.5);
}

// Numbers drawn in blocks equal those drawn singly, also from states that overflow in the first
// product and stay negative, exceed the moduli or are partly 0.
TEST(UniformNumbers, BlocksAndSkipsAreTheSingleNumbers) {
    constexpr int32_t least = std::numeric_limits<int32_t>::min();
    for (const RandomState &from :
         {start, RandomState{2147483647, 16383, 1}, RandomState{-5, -30306, 7},
          RandomState{least, 30307, 0}, RandomState{0, 0, 0}, RandomState{1, 0, 0}})
        for (const int32_t n : {1, 2, 8, 9, 10, 17, 2047, 2048, 2049, 10000}) {
            RandomState blocks = from;
            RandomState single = from;
            Samples u(static_cast<std::size_t>(n));
            qx::RandomUniforms(blocks, u.data(), n);
            for (const double value : u) {
                ASSERT_EQ(value, qx::RandomUniform(single));
                ASSERT_GE(value, 0.0);
                ASSERT_LT(value, 1.0);
            }
            RandomState skipped = from;
            qx::RandomSkip(skipped, n);
            for (const RandomState &state : {blocks, skipped}) {
                ASSERT_EQ(state.s1, single.s1);
                ASSERT_EQ(state.s2, single.s2);
                ASSERT_EQ(state.s3, single.s3);
            }
        }
}

// For every noise, the same seed gives the same samples, other seeds give others, and calls of any
// size without a seed continue one stream.
TEST(Noises, StreamsRestartByASeedAndJoinWithoutOne) {
    GaussSpare spare = {};
    BinomialCache cache = {};
    typedef std::function<Samples(int32_t n, int32_t seed, RandomState &)> Noise;
    const std::vector<Noise> noises = {
        [](int32_t n, int32_t seed, RandomState &s) { return White(n, seed, s); },
        [&](int32_t n, int32_t seed, RandomState &s) { return Gaussian(n, seed, s, spare); },
        [](int32_t n, int32_t seed, RandomState &s) { return Gamma(n, 2, seed, s); },
        [](int32_t n, int32_t seed, RandomState &s) { return Gamma(n, 6, seed, s); },
        [](int32_t n, int32_t seed, RandomState &s) { return Poisson(n, 5.0, seed, s); },
        [](int32_t n, int32_t seed, RandomState &s) { return Poisson(n, 12.0, seed, s); },
        [&](int32_t n, int32_t seed, RandomState &s) {
            return Binomial(n, 9, 0.6, seed, s, cache);
        },
        [&](int32_t n, int32_t seed, RandomState &s) {
            return Binomial(n, 40, 0.02, seed, s, cache);
        },
        [&](int32_t n, int32_t seed, RandomState &s) {
            return Binomial(n, 90, 0.6, seed, s, cache);
        },
    };
    for (std::size_t which = 0; which < noises.size(); ++which) {
        SCOPED_TRACE(which);
        RandomState state = start;
        const Samples whole = noises[which](2500, 77, state);
        const RandomState end = state;
        EXPECT_NE(noises[which](2500, 78, state), whole);
        EXPECT_EQ(noises[which](2500, 77, state), whole);
        Samples joined = noises[which](3, 77, state);
        for (const int32_t n : {3, 1, 700, 19, 1774}) {
            const Samples next = noises[which](n, n % 2 == 0 ? 0 : -1, state);
            joined.insert(joined.end(), next.begin(), next.end());
        }
        EXPECT_EQ(joined, whole);
        EXPECT_EQ(state.s1, end.s1);
        EXPECT_EQ(state.s3, end.s3);
    }
}

TEST(Noises, GaussKeepsItsSpareUnscaled) {
    RandomState state = start;
    GaussSpare spare = {1, 1.5};
    EXPECT_EQ(Gaussian(1, -1, state, spare, 3.0), Samples{4.5});
    EXPECT_EQ(spare.hasSpare, 0);
    EXPECT_EQ(state.s1, start.s1) << "a spare uses no random number";
    Gaussian(1, -1, state, spare, 1.0);
    EXPECT_EQ(spare.hasSpare, 1);
    const double kept = spare.spare;
    EXPECT_EQ(Gaussian(1, -1, state, spare, -2.0), Samples{-2.0 * kept});
    Gaussian(1, -1, state, spare, 1.0);
    Gaussian(2, 5, state, spare, 1.0);
    EXPECT_EQ(spare.hasSpare, 0) << "a seed discards the spare";
}

// A point of the unit disc with its radius transformed to a Rayleigh distribution: the pair of the
// polar method, from the same numbers, in long double.
TEST(Noises, GaussIsThePolarMethod) {
    RandomState state = start;
    GaussSpare spare = {};
    const Samples x = Gaussian(2000, -1, state, spare);
    OneSequence exact(start);
    for (std::size_t i = 0; i < x.size(); i += 2) {
        std::complex<long double> point;
        do {
            const long double a = 2 * exact.next() - 1;
            point = {a, 2 * exact.next() - 1};
        } while (std::norm(point) >= 1);
        const auto scaled = std::polar(std::sqrt(-4 * std::log(std::abs(point))), std::arg(point));
        ASSERT_NEAR(x[i], static_cast<double>(scaled.imag()), 3e-14);
        ASSERT_NEAR(x[i + 1], static_cast<double>(scaled.real()), 3e-14);
    }
}

// Holds for any content of the cache.
TEST(Noises, BinomialStaysWithinTheTrials) {
    RandomState state = start;
    BinomialCache cache = {0.3, 0.7, 0.0, 0.0, 1000.0, 1e4, 100};
    for (const double value : Binomial(3000, 100, 0.3, -1, state, cache))
        ASSERT_LE(value, 100.0);
}

// The documented rejections, from the numbers of the single sequence, in long double. They decide
// which numbers are used, so a slightly wrong factor desynchronises the stream.
TEST(Noises, RejectionsUseTheNumbersAsDocumented) {
    typedef long double Long;
    const auto tangent = [](OneSequence &u) {
        return std::tan(std::numbers::pi_v<long double> * u.next());
    };
    RandomState state = start;
    OneSequence u(start);
    for (const double value : Poisson(3000, 40.0, -1, state)) {
        const Long mean = 40;
        Long y = 0;
        Long v = 0;
        do {
            do {
                y = tangent(u);
                v = std::sqrt(2 * mean) * y + mean;
            } while (v < 0);
            v = std::floor(v);
        } while (u.next() > 0.9L * (1 + y * y) *
                                std::exp((v - mean) * std::log(mean) - std::lgamma(v + 1) +
                                         std::lgamma(mean + 1)));
        ASSERT_EQ(value, static_cast<double>(v));
    }
    state = start;
    u = OneSequence(start);
    BinomialCache cache = {};
    for (const double value : Binomial(3000, 100, 0.7, -1, state, cache)) {
        const Long q = 1 - Long{0.7};
        Long y = 0;
        Long v = 0;
        const Long width = std::sqrt(200 * q * (1 - q));
        do {
            do {
                y = tangent(u);
                v = width * y + 100 * q;
            } while (v < 0 || v >= 101);
            v = std::floor(v);
        } while (u.next() >
                 1.2L * width * (1 + y * y) *
                     std::exp(std::lgamma(101.0L) - std::lgamma(v + 1) - std::lgamma(101 - v) +
                              v * std::log(q) + (100 - v) * std::log(1 - q)));
        ASSERT_EQ(value, static_cast<double>(100 - v));
    }
    state = start;
    u = OneSequence(start);
    for (const double value : Gamma(3000, 9, -1, state)) {
        Long y = 0;
        Long v = 0;
        do {
            do {
                Long a = 0;
                Long b = 0;
                do {
                    a = 2 * u.next() - 1;
                    b = 2 * u.next() - 1;
                } while (a * a + b * b > 1);
                y = b / a;
                v = std::sqrt(17.0L) * y + 8;
            } while (v <= 0);
        } while (u.next() > (1 + y * y) * std::exp(8 * std::log(v / 8) - std::sqrt(17.0L) * y));
        ASSERT_NEAR(value, static_cast<double>(v), 1e-9);
    }
}

// The Kolmogorov-Smirnov statistic, which exceeds 1.95 with a probability of 0.001.
double Discrepancy(Samples x, const std::function<double(double)> &distribution) {
    std::sort(x.begin(), x.end());
    const auto n = static_cast<double>(x.size());
    double worst = 0.0;
    for (std::size_t i = 0; i < x.size(); ++i) {
        const double expected = distribution(x[i]);
        const auto rank = static_cast<double>(i);
        worst = std::max({worst, (rank + 1.0) / n - expected, expected - rank / n});
    }
    return worst * std::sqrt(n);
}

// The number of standard deviations by which Pearson's statistic exceeds its mean. Consecutive
// values are grouped to expected counts of at least 20.
double ExcessOfChiSquare(const Samples &x, int32_t values,
                         const std::function<double(int32_t)> &probability) {
    std::vector<double> counts(static_cast<std::size_t>(values), 0.0);
    for (const double value : x)
        counts.at(static_cast<std::size_t>(value)) += 1.0;
    const auto n = static_cast<double>(x.size());
    double chiSquare = 0.0;
    double restCount = 0.0;
    double restExpected = 0.0;
    int cells = 0;
    for (int32_t k = 0; k < values; ++k) {
        restCount += counts[static_cast<std::size_t>(k)];
        restExpected += n * probability(k);
        if (restExpected < 20.0)
            continue;
        chiSquare += (restCount - restExpected) * (restCount - restExpected) / restExpected;
        restCount = restExpected = 0.0;
        ++cells;
    }
    EXPECT_GT(cells, 2);
    return (chiSquare - (cells - 1)) / std::sqrt(2.0 * (cells - 1));
}

constexpr int32_t million = 1000000;

TEST(Distributions, OfContinuousNoisesAtAMillionSamples) {
    RandomState state = start;
    GaussSpare spare = {};
    EXPECT_LT(Discrepancy(White(million, 3, state, 2.5), [](double x) { return x / 5.0 + 0.5; }),
              1.95);
    EXPECT_LT(Discrepancy(Gaussian(million, 3, state, spare, 2.0),
                          [](double x) { return std::erfc(-x / std::sqrt(8.0)) / 2.0; }),
              1.95);
    // The complement is the probability of fewer than `order` events of rate 1 up to x.
    for (const int32_t order : {1, 3, 5, 6, 20})
        EXPECT_LT(Discrepancy(Gamma(million, order, 9, state),
                              [=](double x) {
                                  double term = std::exp(-x);
                                  double sum = 0.0;
                                  for (int32_t k = 0; k < order; term *= x / ++k)
                                      sum += term;
                                  return 1.0 - sum;
                              }),
                  1.95)
            << order;
}

TEST(Distributions, OfCountingNoisesAtAMillionSamples) {
    RandomState state = start;
    BinomialCache cache = {};
    for (const double mean : {0.0, 0.3, 4.0, 11.9, 12.0, 80.0}) {
        const Samples x = Poisson(million, mean, 5, state);
        if (mean == 0.0)
            EXPECT_EQ(*std::max_element(x.begin(), x.end()), 0.0);
        else
            EXPECT_LT(ExcessOfChiSquare(x, 400,
                                        [=](int32_t k) {
                                            return std::exp(k * std::log(mean) - mean -
                                                            std::lgamma(k + 1.0));
                                        }),
                      4.0)
                << mean;
    }
    struct Case {
        int32_t trials;
        double p;
    };
    for (const Case &c : {Case{10, 0.3}, {24, 0.9}, {100, 0.4}, {100, 0.9}, {1000, 0.5}})
        EXPECT_LT(ExcessOfChiSquare(Binomial(million, c.trials, c.p, 5, state, cache), c.trials + 1,
                                    [=](int32_t k) {
                                        return std::exp(
                                            std::lgamma(c.trials + 1.0) - std::lgamma(k + 1.0) -
                                            std::lgamma(c.trials - k + 1.0) + k * std::log(c.p) +
                                            (c.trials - k) * std::log1p(-c.p));
                                    }),
                  4.0)
            << c.trials << " trials of " << c.p;
    // Less than one expected success in many trials: Poisson events by definition.
    for (const Case &c : {Case{30, 0.03}, {30, 0.98}})
        EXPECT_LT(ExcessOfChiSquare(Binomial(million, c.trials, c.p, 5, state, cache), c.trials + 1,
                                    [=](int32_t k) {
                                        const double mean = c.trials * std::min(c.p, 1.0 - c.p);
                                        const int32_t events = c.p > 0.5 ? c.trials - k : k;
                                        return std::exp(events * std::log(mean) - mean -
                                                        std::lgamma(events + 1.0));
                                    }),
                  4.0)
            << c.trials << " trials of " << c.p;
    for (const int32_t trials : {0, 7, 50}) {
        EXPECT_EQ(Binomial(3, trials, 1.0, 5, state, cache), Samples(3, trials));
        EXPECT_EQ(Binomial(3, trials, 0.0, 5, state, cache), Samples(3, 0.0));
    }
}

// The content of the cache for other arguments must not be used.
TEST(Noises, BinomialRefreshesItsCache) {
    RandomState state = start;
    BinomialCache shared = {};
    for (const auto &[trials, p] : {std::pair{100, 0.4}, {100, 0.3}, {90, 0.3}, {90, 0.7}}) {
        BinomialCache fresh = {};
        const Samples x = Binomial(100, trials, p, 8, state, fresh);
        EXPECT_EQ(Binomial(100, trials, p, 8, state, shared), x);
    }
    EXPECT_EQ(shared.nOld, 90);
    EXPECT_EQ(shared.pOld, 1.0 - 0.7);
    // An altered cache is detected, because it holds the number of trials twice.
    BinomialCache fresh = {};
    const Samples x = Binomial(100, 100, 0.3, 8, state, fresh);
    BinomialCache strange = fresh;
    strange.enOld = 200;
    EXPECT_EQ(Binomial(100, 100, 0.3, 8, state, strange), x);
}

// By the definition of the transform, every harmonic has the amplitude and the angle drawn for it.
TEST(Noises, PeriodNoiseHasAFlatSpectrumOfIntegerAngles) {
    for (const int32_t n : {1, 2, 3, 4, 16, 45, 101}) {
        const double amplitude = 0.75;
        const int32_t seed = 6;
        RandomState state = start;
        DBLArray x;
        ErrorCode err = 1;
        EXPECT_EQ(PeriodNoise(&n, &amplitude, &seed, x.handle(), &err, &state), 0);
        EXPECT_EQ(err, 0);
        ASSERT_EQ(x.size(), n);
        RandomState reference = start;
        qx::RandomSeed(seed, reference);
        for (int32_t k = 0; k <= n / 2; ++k) {
            std::complex<long double> sum = 0;
            for (int32_t i = 0; i < n; ++i)
                sum +=
                    std::polar<long double>(1, -2 * std::numbers::pi_v<long double> * k * i / n) *
                    static_cast<long double>(x[i]);
            const bool isHarmonic = k > 0 && 2 * k < n;
            const auto expected =
                isHarmonic ? std::polar<long double>(amplitude * n / 2, qx::RandomInt15(reference))
                           : std::complex<long double>(0);
            EXPECT_NEAR(static_cast<double>(std::abs(sum - expected)), 0.0, 1e-14 * n)
                << n << " " << k;
        }
        EXPECT_EQ(state.s1, reference.s1);
    }
}

// Random numbers that are all 0 never fall into the unit disc; noises that would draw endlessly
// return zeros.
TEST(Noises, AConstantStateTerminates) {
    RandomState still = {0, 30307, 0};
    GaussSpare spare = {1, 2.0};
    BinomialCache cache = {};
    EXPECT_EQ(White(2, 0, still), (Samples{-0.5, -0.5}));
    EXPECT_EQ(Gaussian(3, 0, still, spare), (Samples{2.0, 0.0, 0.0}));
    EXPECT_EQ(Gamma(2, 6, 0, still), (Samples{0.0, 0.0}));
    EXPECT_EQ(Poisson(2, 3.0, 0, still), (Samples{0.0, 0.0}));
    EXPECT_EQ(Poisson(2, 20.5, 0, still), (Samples{20.0, 20.0}));
    EXPECT_EQ(Binomial(2, 100, 0.25, 0, still, cache), (Samples{25.0, 25.0}));
    RandomState almost = {1, 0, 0};
    EXPECT_NE(Gaussian(2, 0, almost, spare), (Samples{0.0, 0.0}));
}

TEST(Noises, CodesComeInTheirOrder) {
    RandomState state = start;
    GaussSpare spare = {};
    BinomialCache cache = {};
    const double value = 1.0;
    const int32_t seed = 1;
    for (const int32_t n : {0, -4}) {
        DBLArray x(3);
        ErrorCode err = 1;
        EXPECT_EQ(white(x.handle(), &n, &value, &seed, &err, &state), 0);
        EXPECT_EQ(err, ErrEmptyInput);
        EXPECT_EQ(Gauss(x.handle(), &n, &value, &seed, &err, &state, &spare), 0);
        EXPECT_EQ(err, ErrEmptyInput);
        EXPECT_EQ(PeriodNoise(&n, &value, &seed, x.handle(), &err, &state), ErrEmptyInput);
        EXPECT_EQ(err, ErrEmptyInput);
        EXPECT_EQ(GammaNoiseH(x.handle(), n, 1, seed, &state), ErrEmptyInput);
        EXPECT_EQ(PoissonNoiseH(x.handle(), n, 0.0, seed, &state), ErrEmptyInput);
        EXPECT_EQ(x.size(), 0);
        U32Array counts(3);
        EXPECT_EQ(BinomialNoiseH(counts.handle(), n, 0, 1.0, seed, &state, &cache), ErrEmptyInput);
        EXPECT_EQ(GammaNoiseH(x.handle(), n, 0, seed, &state), ErrInvalidSelector);
        EXPECT_EQ(PoissonNoiseH(x.handle(), n, -0.1, seed, &state), ErrInvalidSelector);
        for (const double p : {-0.1, 1.1, std::nan("")})
            EXPECT_EQ(BinomialNoiseH(counts.handle(), n, 1, p, seed, &state, &cache),
                      ErrInvalidSelector);
        EXPECT_EQ(BinomialNoiseH(counts.handle(), n, -1, 0.5, seed, &state, &cache),
                  ErrInvalidSelector);
        EXPECT_EQ(counts.size(), 0);
    }
    EXPECT_EQ(state.s1, start.s1) << "a failure neither draws nor seeds";
}

// The noise of 2026.

Samples Of(const std::function<ErrorCode(DBL1D)> &call) {
    DBLArray x;
    EXPECT_EQ(call(x.handle()), 0);
    return x.values();
}

// Each call as a function of the number of values and the position.
typedef std::function<Samples(int32_t n, int32_t key, int32_t stream, double position)> Source;
const std::vector<std::pair<const char *, Source>> sources = {
    {"white",
     [](int32_t n, int32_t key, int32_t stream, double at) {
         return Of([=](DBL1D x) { return White2026(x, n, 2.0, key, stream, at); });
     }},
    {"Gauss",
     [](int32_t n, int32_t key, int32_t stream, double at) {
         return Of([=](DBL1D x) { return Gauss2026(x, n, 3.0, key, stream, at); });
     }},
    {"gamma",
     [](int32_t n, int32_t key, int32_t stream, double at) {
         return Of([=](DBL1D x) { return Gamma2026(x, n, 0.6, key, stream, at); });
     }},
    {"Poisson",
     [](int32_t n, int32_t key, int32_t stream, double at) {
         return Of([=](DBL1D x) { return Poisson2026(x, n, 1e7, key, stream, at); });
     }},
    {"binomial",
     [](int32_t n, int32_t key, int32_t stream, double at) {
         return Of([=](DBL1D x) { return Binomial2026(x, n, 1e8, 0.7, key, stream, at); });
     }},
};

// The known answers of the publication, and those of a generic implementation of the definition,
// whose form with 64-bit words gives NumPy's bits (make_philox.py).
TEST(CounterNoise, HasTheKnownBlocks) {
    const qx::NoiseBlock zeros = qx::PhiloxBlock({0, 0, 0, qx::NoiseKind{0}}, 0, 0);
    EXPECT_EQ(zeros.a, 0xe169c58d6627e8d5);
    EXPECT_EQ(zeros.b, 0x9b00dbd8bc57ac4c);
    const qx::NoiseBlock ones =
        qx::PhiloxBlock({-1, -1, ~uint64_t{0}, qx::NoiseKind{0xffffffff}}, 0, 0xffffffff);
    EXPECT_EQ(ones.a, 0x41c83b0e408f276d);
    EXPECT_EQ(ones.b, 0x6d5451fda20bc7c6);
    const qx::NoiseBlock digits = qx::PhiloxBlock({static_cast<int32_t>(0xa4093822), 0x299f31d0,
                                                   0x85a308d3243f6a88, qx::NoiseKind{0x03707344}},
                                                  0, 0x13198a2e);
    EXPECT_EQ(digits.a, 0x94fdcceb'd16cfe09);
    EXPECT_EQ(digits.b, 0x24126ea1'5001e420);
    for (const auto &row : ReadTable(TestData("philox.dat"))) {
        const auto &v = row.arguments;
        const qx::NoisePlace place = {static_cast<int32_t>(v[0]), static_cast<int32_t>(v[1]),
                                      static_cast<uint64_t>(v[2]),
                                      static_cast<qx::NoiseKind>(static_cast<uint32_t>(v[3]))};
        const qx::NoiseBlock one = qx::PhiloxBlock(place, 0, 0);
        EXPECT_EQ(one.a >> 32, static_cast<uint64_t>(v[4])) << row.text;
        EXPECT_EQ(one.b & 0xffffffff, static_cast<uint64_t>(row.value)) << row.text;
        uint64_t a[8], b[8];
        for (const uint32_t attempt : {0U, 0xfffffffeU}) {
            qx::PhiloxBlocks(place, attempt, 7, a, b);
            for (uint64_t i = 0; i < 7; ++i) {
                EXPECT_EQ(a[i], qx::PhiloxBlock(place, i, attempt).a) << row.text;
                EXPECT_EQ(b[i], qx::PhiloxBlock(place, i, attempt).b) << row.text;
            }
        }
    }
}

// Any position can be computed directly: parts, including single values, equal those of one piece,
// also past 2^32.
TEST(CounterNoise, IsTheSameInParts) {
    for (const auto &[name, source] : sources)
        for (const double at : {0.0, 4294967000.0, 0x1p53 - 1000}) {
            const Samples whole = source(1000, 5, -3, at);
            for (const int32_t size : {1, 3, 97, 256, 333}) {
                const auto first = static_cast<std::size_t>(size) * 2;
                const Samples part = source(size, 5, -3, at + 2.0 * size);
                ASSERT_TRUE(std::equal(part.begin(), part.end(),
                                       whole.begin() + static_cast<std::ptrdiff_t>(first)))
                    << name << " " << at << " " << size;
            }
            EXPECT_NE(source(1000, 6, -3, at), whole) << name;
            EXPECT_NE(source(1000, 5, -2, at), whole) << name;
        }
}

// The largest distance of the distribution of the values from the exact one, times the square root
// of their number; exceeds 1.95 for 1 of 1000 good generators.
double KolmogorovSmirnov(Samples x, const std::function<double(double)> &cdf) {
    std::sort(x.begin(), x.end());
    const double n = static_cast<double>(x.size());
    double distance = 0;
    for (std::size_t i = 0; i < x.size(); ++i) {
        const double exact = cdf(x[i]), below = static_cast<double>(i) / n;
        distance = std::max({distance, exact - below, below + 1 / n - exact});
    }
    return distance * std::sqrt(n);
}

double NormalCdf(double x) { return 0.5 * std::erfc(-x / std::numbers::sqrt2); }

TEST(CounterNoise, FollowsItsContinuousDistributions) {
    constexpr int32_t n = 200000;
    for (const int32_t key : {1, 77, -5}) {
        const Samples u = sources[0].second(n, key, 0, 0.0);
        EXPECT_LT(KolmogorovSmirnov(u, [](double x) { return (x + 2) / 4; }), 1.95);
        const Samples z = sources[1].second(n, key, 0, 0.0);
        EXPECT_LT(KolmogorovSmirnov(z, [](double x) { return NormalCdf(x / 3); }), 1.95);
        for (const double shape : {0.05, 0.5, 1.0, 1.5, 3.0, 40.0}) {
            const Samples g = Of([&](DBL1D x) { return Gamma2026(x, n / 8, shape, key, 0, 0.0); });
            EXPECT_LT(
                KolmogorovSmirnov(g, [&](double x) { return qx::IncompleteGammaP(shape, x); }),
                1.95)
                << shape << " " << key;
        }
    }
    // Quantiles: each sample corresponds to the uniform number of its block, including the tails.
    double worst = 0;
    const Samples z = Of([](DBL1D x) { return Gauss2026(x, n, 1.0, 3, 4, 0.0); });
    const qx::NoisePlace place = {3, 4, 0, qx::NoiseKind::Gaussian};
    for (std::size_t i = 0; i < z.size(); ++i) {
        const double u = qx::CentredUniform(qx::PhiloxBlock(place, i, 0).a);
        const double tail = 0.5 - std::fabs(u); // exact
        if (tail > 0.49 || tail < 0x1p-12)
            continue;
        const double error = 0.5 * std::erfc(std::fabs(z[i]) / std::numbers::sqrt2) / tail - 1;
        worst = std::max(worst, std::fabs(error));
        ASSERT_EQ(z[i] > 0, u > 0);
    }
    EXPECT_LT(worst, 1e-14);
    for (const uint64_t m : {uint64_t{0}, uint64_t{1} << 12, uint64_t{5} << 30, uint64_t{1} << 51})
        for (const uint64_t b : {uint64_t{0}, uint64_t{1} << 40, ~uint64_t{0}}) {
            const double x = qx::NormalTailQuantile({m, b});
            const double tail =
                (static_cast<double>(m >> 12) + (static_cast<double>(b) + 0.5) * 0x1p-64) * 0x1p-52;
            EXPECT_NEAR(0.5 * std::erfc(-x / std::numbers::sqrt2) / tail, 1.0, 2e-13) << m;
            EXPECT_EQ(qx::NormalTailQuantile({~m, b}), -x);
        }
}

// Chi-square over the values with an expected count of at least 20, and all others as one class,
// transformed to a standard normal variate (E. B. Wilson and M. M. Hilferty, 1931).
double ChiSquare(const Samples &x, const std::function<double(double)> &lnProbability, double from,
                 double to) {
    const double n = static_cast<double>(x.size());
    std::map<double, double> counts;
    for (const double value : x)
        counts[value] += 1;
    double sum = 0, cells = 0, left = n, leftCount = n;
    for (double k = from; k <= to; ++k) {
        const double expected = n * std::exp(lnProbability(k));
        if (expected < 20)
            continue;
        sum += (counts[k] - expected) * (counts[k] - expected) / expected;
        cells += 1;
        left -= expected;
        leftCount -= counts[k];
    }
    if (left > 5)
        sum += (leftCount - left) * (leftCount - left) / left;
    const double freedom = left > 5 ? cells : cells - 1, spread = 2 / (9 * freedom);
    return (std::cbrt(sum / freedom) - (1 - spread)) / std::sqrt(spread);
}

TEST(CounterNoise, FollowsItsDiscreteDistributions) {
    constexpr int32_t n = 300000;
    for (const double mean : {0.2, 3.0, 9.99, 10.0, 47.3, 800.0}) {
        const Samples k = Of([&](DBL1D x) { return Poisson2026(x, n, mean, 9, 1, 0.0); });
        const double chi = ChiSquare(
            k, [&](double j) { return j * std::log(mean) - mean - std::lgamma(j + 1); }, 0, 2000);
        EXPECT_LT(std::fabs(chi), 3.3) << mean;
    }
    struct Trials {
        double trials, p;
    };
    for (const Trials &of :
         {Trials{1, 0.25}, Trials{40, 0.2}, Trials{40, 0.8}, Trials{40, 0.26}, Trials{25, 0.5},
          Trials{3000, 0.3}, Trials{1e6, 1e-5}, Trials{1e6, 0.9999}}) {
        const double trials = of.trials, p = of.p;
        const Samples k = Of([&](DBL1D x) { return Binomial2026(x, n, trials, p, 9, 2, 0.0); });
        const auto lnProbability = [&](double j) {
            return std::lgamma(trials + 1) - std::lgamma(j + 1) - std::lgamma(trials - j + 1) +
                   j * std::log(p) + (trials - j) * std::log1p(-p);
        };
        const double middle = trials * p;
        EXPECT_LT(std::fabs(ChiSquare(k, lnProbability, std::max(0.0, std::floor(middle) - 500),
                                      std::min(trials, middle + 500))),
                  3.3)
            << trials << " " << p;
    }
    EXPECT_EQ(Of([](DBL1D x) { return Binomial2026(x, 3, 7, 1.0, 9, 2, 0.0); }), Samples(3, 7.0));
    EXPECT_EQ(Of([](DBL1D x) { return Binomial2026(x, 3, 7, 0.0, 9, 2, 0.0); }), Samples(3, 0.0));
    EXPECT_EQ(Of([](DBL1D x) { return Poisson2026(x, 3, 0.0, 9, 2, 0.0); }), Samples(3, 0.0));
}

// At large means the distribution is normal except for the skewness, which shifts it by 1 / (6
// sigma). Mean and variance are exact, where the elder's standard deviation is 10 % too large.
TEST(CounterNoise, IsExactAtLargeMeans) {
    constexpr int32_t n = 400000;
    const auto standard = [](Samples x, double mean, double deviation) {
        for (double &value : x) {
            EXPECT_EQ(value, std::floor(value));
            value = (value - mean) / deviation;
        }
        return x;
    };
    for (const double mean : {1e9, 1e12, 1e15}) {
        const Samples poisson = standard(
            Of([&](DBL1D x) { return Poisson2026(x, n, mean, 2, 3, 0.0); }), mean, std::sqrt(mean));
        const Samples binomial =
            standard(Of([&](DBL1D x) { return Binomial2026(x, n, 4 * mean, 0.25, 2, 3, 0.0); }),
                     mean, std::sqrt(0.75 * mean));
        for (const Samples &x : {poisson, binomial}) {
            EXPECT_LT(KolmogorovSmirnov(x, NormalCdf), 1.95) << mean;
            double square = 0;
            for (const double value : x)
                square += value * value;
            EXPECT_NEAR(square / n, 1, 5 * std::sqrt(2.0 / n)) << mean;
        }
    }
}

// The first values of 10^5 streams, and of as many keys, are uniformly distributed and not
// correlated with those at distances 2^k and 3 2^(k-1).
TEST(CounterNoise, HasIndependentStreams) {
    constexpr int32_t n = 100000;
    for (const bool byKey : {false, true}) {
        Samples first;
        for (int32_t i = 0; i < n; ++i)
            first.push_back(byKey ? sources[0].second(1, i, 0, 0.0)[0]
                                  : sources[0].second(1, 0, i, 0.0)[0]);
        const auto correlation = [&](int32_t distance) {
            double sum = 0;
            for (std::size_t i = static_cast<std::size_t>(distance); i < first.size(); ++i)
                sum += first[i] * first[i - static_cast<std::size_t>(distance)];
            return sum / (4.0 / 3) / std::sqrt(n - distance); // with standard deviation 1
        };
        for (int32_t distance = 1; distance < n / 2; distance *= 2) {
            EXPECT_LT(std::fabs(correlation(distance)), 4) << distance;
            EXPECT_LT(std::fabs(correlation(3 * distance / 2)), 4) << distance;
        }
        EXPECT_LT(KolmogorovSmirnov(first, [](double x) { return (x + 2) / 4; }), 1.95);
    }
}

TEST(CounterNoise, RefusesInvalidArguments) {
    DBLArray x;
    const double most = 0x1p53, nan = std::numeric_limits<double>::quiet_NaN();
    for (const double position : {-1.0, 0.5, most - 2, most, nan, -nan})
        EXPECT_EQ(Gauss2026(x.handle(), 3, 1.0, 1, 1, position), ErrIndexOutOfRange) << position;
    EXPECT_EQ(Gauss2026(x.handle(), 3, 1.0, 1, 1, most - 3), 0);
    EXPECT_EQ(White2026(x.handle(), 0, 1.0, 1, 1, nan), ErrEmptyInput);
    for (const double shape : {0.0, -1.0, nan, 1 / 0.0})
        EXPECT_EQ(Gamma2026(x.handle(), 0, shape, 1, 1, 0.0), ErrInvalidSelector);
    for (const double mean : {-1.0, nan, 1.01e15})
        EXPECT_EQ(Poisson2026(x.handle(), 0, mean, 1, 1, 0.0), ErrInvalidSelector);
    for (const double trials : {-1.0, nan, 2.5, 0x1p53})
        EXPECT_EQ(Binomial2026(x.handle(), 0, trials, 0.5, 1, 1, 0.0), ErrInvalidSelector);
    for (const double p : {-0.1, nan, 1.1})
        EXPECT_EQ(Binomial2026(x.handle(), 0, 5, p, 1, 1, 0.0), ErrInvalidSelector);
}

} // namespace
} // namespace qx::test
