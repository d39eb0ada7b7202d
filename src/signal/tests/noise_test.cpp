#include "qx/qx.h"
#include "signal/random.h"
#include "tests/support/hostile_host.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <functional>
#include <limits>
#include <numbers>
#include <numeric>
#include <vector>

namespace {

using qx::test::DBLArray;
using U32Array = qx::test::Array1D<qx::ElementType::U32>;
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

// The three sequences are one: H. Zeisel, "Remark ASR 61: A remark on algorithm AS 183", 1986.
class OneSequence {
public:
    explicit OneSequence(const RandomState &s)
        : x_((int64_t{s.s1} * 30307 * 30323 + int64_t{s.s2} * 30269 * 30323 +
              int64_t{s.s3} * 30269 * 30307) %
             modulus) {}
    long double next() {
        int64_t product = 0; // by 15 bits of the factor at a time
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

// What is drawn in blocks is what is drawn singly, also from states that wrap in the first product
// and stay negative, lie beyond the moduli or are 0 in part.
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

// Every noise: the same seed the same samples, other seeds others, and calls of any size without a
// seed join to one stream.
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
    EXPECT_EQ(state.s1, start.s1) << "a spare costs no number";
    Gaussian(1, -1, state, spare, 1.0);
    EXPECT_EQ(spare.hasSpare, 1);
    const double kept = spare.spare;
    EXPECT_EQ(Gaussian(1, -1, state, spare, -2.0), Samples{-2.0 * kept});
    Gaussian(1, -1, state, spare, 1.0);
    Gaussian(2, 5, state, spare, 1.0);
    EXPECT_EQ(spare.hasSpare, 0) << "a seed forgets the spare";
}

// A point of the unit disc, its radius by the Rayleigh transform: the pair as the polar method has
// it, from the same numbers, in long double.
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

// Whatever a caller left in the cache.
TEST(Noises, BinomialStaysWithinTheTrials) {
    RandomState state = start;
    BinomialCache cache = {0.3, 0.7, 0.0, 0.0, 1000.0, 1e4, 100};
    for (const double value : Binomial(3000, 100, 0.3, -1, state, cache))
        ASSERT_LE(value, 100.0);
}

// The rejections as they are told, from the numbers of the one sequence in long double: they decide
// which numbers are used, so a factor that is off by little leaves the stream.
TEST(Noises, RejectionsUseTheNumbersAsTold) {
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

// Kolmogorov and Smirnov's statistic; above 1.95 with a probability of 0.001.
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

// Standard deviations by which Pearson's statistic exceeds its mean, over counts that are expected
// at least 20 times; 0 where all samples are what they must be.
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
    // Fewer than `order` events of rate 1 up to x.
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
    // Less than one success in many trials: Poisson events by definition.
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

// What the cache holds from other arguments must not be used.
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
    // One that was not kept as it was: the number of trials stands in it twice.
    BinomialCache fresh = {};
    const Samples x = Binomial(100, 100, 0.3, 8, state, fresh);
    BinomialCache strange = fresh;
    strange.enOld = 200;
    EXPECT_EQ(Binomial(100, 100, 0.3, 8, state, strange), x);
}

// The transform by its definition: every harmonic has the amplitude and the angle drawn for it.
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

// Numbers that are all 0 meet no disc: the noises that would draw for ever give zeros.
TEST(Noises, AStillStateEnds) {
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
    EXPECT_EQ(state.s1, start.s1) << "a failure draws nothing and seeds nothing";
}

} // namespace
