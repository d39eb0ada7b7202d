#include "qx/tones.h"

#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <ctime>
#include <limits>
#include <numbers>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Samples;

const double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double inf = std::numeric_limits<double>::infinity();
constexpr double pi = std::numbers::pi;

struct Tone {
    double frequency, amplitude, phase;
};
typedef std::vector<Tone> Tones;

// Sums of tones in long double, rounded once.
Samples Sampled(const Tones &tones, int32_t n, double dt = 1, double offset = 0) {
    Samples y(static_cast<std::size_t>(n));
    for (std::size_t t = 0; t < y.size(); ++t) {
        long double sum = offset;
        for (const Tone &tone : tones) {
            long double turns = static_cast<long double>(tone.frequency) * dt * t;
            turns -= std::floor(turns);
            sum +=
                tone.amplitude * std::cos(2 * std::numbers::pi_v<long double> * turns + tone.phase);
        }
        y[t] = static_cast<double>(sum);
    }
    return y;
}

void AddNoise(Samples &y, double sigma, uint64_t seed) {
    Noise noise(seed);
    for (double &value : y) {
        double sum = 0; // of twelve uniform numbers in [-1, 1), with variance 4
        for (int k = 0; k < 12; ++k)
            sum += noise.symmetric();
        value += sigma / 2 * sum;
    }
}

// The largest relative error; infinite if the numbers of tones differ.
double Error(const Tones &found, const Tones &expected) {
    if (found.size() != expected.size())
        return inf;
    double error = 0;
    for (std::size_t i = 0; i < found.size(); ++i) {
        const double turn = std::remainder(found[i].phase - expected[i].phase, 2 * pi);
        error =
            std::max({error, std::fabs(found[i].frequency / expected[i].frequency - 1),
                      std::fabs(found[i].amplitude / expected[i].amplitude - 1), std::fabs(turn)});
    }
    return error;
}

struct Multiple {
    Tones tones;
    double residualRms;
};

Multiple Measure(const Samples &y, int32_t count, int32_t order = 1, double dt = 1) {
    const DBLArray samples(y);
    DBLArray frequencies, amplitudes, phases;
    Multiple found;
    EXPECT_EQ(MultipleToneMeasurements(samples.handle(), dt, count, order, frequencies.handle(),
                                       amplitudes.handle(), phases.handle(), &found.residualRms),
              0);
    for (int32_t i = 0; i < frequencies.size(); ++i)
        found.tones.push_back({frequencies[i], amplitudes[i], phases[i]});
    return found;
}

struct Single {
    Tone tone;
    double offset, residualRms;
    ErrorCode code;
};

Single MeasureOne(const Samples &y, double centre = 0, double halfWidth = 0, double dt = 1) {
    const DBLArray samples(y);
    Single s;
    s.code = SingleToneMeasurement(samples.handle(), dt, centre, halfWidth, &s.tone.frequency,
                                   &s.tone.amplitude, &s.tone.phase, &s.offset, &s.residualRms);
    return s;
}

struct Analysis {
    Tones harmonics;
    double thd, sinad, snr, sfdr, enob, noiseFloor;
    ErrorCode code;
};

Analysis Analyse(const Samples &y, int32_t highest, double fundamental = 0, double fullScale = 0,
                 double dt = 1) {
    const DBLArray samples(y);
    DBLArray frequencies, amplitudes, phases;
    Analysis a;
    a.code = HarmonicAnalysis(samples.handle(), dt, fundamental, highest, fullScale,
                              frequencies.handle(), amplitudes.handle(), phases.handle(), &a.thd,
                              &a.sinad, &a.snr, &a.sfdr, &a.enob, &a.noiseFloor);
    for (int32_t i = 0; i < frequencies.size(); ++i)
        a.harmonics.push_back({frequencies[i], amplitudes[i], phases[i]});
    return a;
}

Tone RandomTone(Noise &noise, double bin, int32_t n) {
    return {bin / n, std::pow(10.0, -noise.positive()), pi * noise.symmetric()};
}

TEST(MultipleTones, HalfABinApartAreExactWithoutNoise) {
    constexpr int32_t n = 256;
    constexpr double apart = 0.5;
    Noise noise(1);
    for (int trial = 0; trial < 300; ++trial) {
        const int count = 1 + trial % 8;
        Tones tones;
        double bin = 1 + 30 * noise.positive();
        for (int k = 0; k < count; ++k) {
            tones.push_back(RandomTone(noise, bin, n));
            // Every third record has a pair at the minimum separation.
            bin += apart + (trial % 3 == 0 && k % 2 == 0 ? 0 : 2 + 10 * noise.positive());
        }
        const Multiple found = Measure(Sampled(tones, n, 1, noise.symmetric()), count);
        EXPECT_LT(Error(found.tones, tones), 1e-9) << "record " << trial;
        EXPECT_LT(found.residualRms, 1e-14);
    }
}

TEST(MultipleTones, AreFoundInShortRecordsAndAtAnyScale) {
    for (int32_t n = 5; n < 70; ++n)
        for (const double bin : {0.7, 1.0, 1.9}) {
            const Tones one = {{bin / n, 2.5, 1.0}};
            EXPECT_LT(Error(Measure(Sampled(one, n, 1, 3), 1).tones, one), 1e-9) << n;
        }
    const Tones two = {{10.25, 1, 3}, {31.5, 0.01, -3}};
    for (const double scale : {1e-300, 1e-5, 1e305}) {
        Samples y = Sampled(two, 1001, 1e-2, 0.5);
        for (double &value : y)
            value *= scale;
        Multiple found = Measure(y, 2, 1, 1e-2);
        for (Tone &tone : found.tones)
            tone.amplitude /= scale;
        EXPECT_LT(Error(found.tones, two), 1e-9);
    }
}

TEST(MultipleTones, EndWhenOnlyRoundingOrNoiseIsLeft) {
    Tones tones = {{0.05, 1, 0.5}, {0.11, 1e-3, 2}, {0.31, 3e-12, -1}};
    EXPECT_EQ(Measure(Sampled({tones[0], tones[1]}, 4096), 10).tones.size(), 2u);
    const Tones weak = Measure(Sampled(tones, 4096), 10).tones;
    ASSERT_EQ(weak.size(), 3u);
    EXPECT_NEAR(weak[2].frequency, 0.31, 1e-7);
    tones[2].amplitude = 3e-13;
    EXPECT_EQ(Measure(Sampled(tones, 4096), 10).tones.size(), 2u);

    std::size_t falseTones = 0;
    for (uint64_t seed = 0; seed < 300; ++seed)
        for (const int32_t n : {12, 256}) {
            Samples y = Sampled({{0.2, 0.1, 0}, {0.32, 2, 1}}, n);
            AddNoise(y, 0.01, seed);
            const std::size_t found = Measure(y, 5).tones.size();
            EXPECT_GE(found, n == 256 ? 2u : 1u);
            falseTones += found > 2;
        }
    EXPECT_LE(falseTones, 1u);
}

TEST(MultipleTones, ComeInTheRequestedOrderAndMinimiseTheResidual) {
    const Tones tones = {{0.11, 0.5, 1}, {0.2, 2, -1}, {0.33, 1, 0.5}};
    Samples y = Sampled(tones, 200, 1, -1);
    AddNoise(y, 0.1, 5);
    const Multiple rising = Measure(y, 3, 1);
    const Multiple falling = Measure(y, 3, 0);
    EXPECT_LT(Error(rising.tones, tones), 0.1);
    EXPECT_LT(Error(falling.tones, {rising.tones[1], rising.tones[2], rising.tones[0]}), 1e-15);
    EXPECT_EQ(rising.residualRms, falling.residualRms);

    // No nearby tone gives a smaller residual, for any constant.
    const auto leaves = [&](const Tones &changed) {
        const Samples model = Sampled(changed, 200);
        double mean = 0, squares = 0;
        for (std::size_t t = 0; t < y.size(); ++t)
            mean += (y[t] - model[t]) / 200;
        for (std::size_t t = 0; t < y.size(); ++t)
            squares += (y[t] - model[t] - mean) * (y[t] - model[t] - mean);
        return std::sqrt(squares / 200);
    };
    EXPECT_NEAR(leaves(rising.tones), rising.residualRms, 1e-12);
    for (std::size_t k = 0; k < 3; ++k)
        for (double Tone::*part : {&Tone::frequency, &Tone::amplitude, &Tone::phase})
            for (const double change : {-1e-4, 1e-4}) {
                Tones changed = rising.tones;
                changed[k].*part += change;
                EXPECT_GT(leaves(changed), rising.residualRms);
            }
}

// Fits to a record that is not a sum of tones do not converge, and each additional tone shifts the
// others. Without limits on the steps and on the number of tones fitted together this takes
// minutes.
TEST(MultipleTones, OfAnImpulseTakeTimeProportionalToSamplesAndTones) {
    constexpr int32_t n = 1000;
    Samples y(n);
    for (int32_t t = 0; t < n; ++t)
        y[static_cast<std::size_t>(t)] = t * 37 % 64 / 64.0 - 0.5;
    y[0] = 1002;
    const std::clock_t begin = std::clock();
    const Multiple found = Measure(y, 40);
    EXPECT_LT(std::clock() - begin, 60 * CLOCKS_PER_SEC);
    EXPECT_EQ(found.tones.size(), 40u);
    EXPECT_LT(found.residualRms, Measure(y, 20).residualRms);
}

TEST(SingleTone, IsTheLargestOfItsBand) {
    const Tones tones = {{50, 10, 0.5}, {120, 1, -2}, {340, 0.5, 3}};
    const Samples y = Sampled(tones, 1500, 1e-3, 7);
    // The largest tone is disturbed by the others; fitting all tones together would avoid that.
    const Single largest = MeasureOne(y, 0, 0, 1e-3);
    EXPECT_EQ(largest.code, 0);
    EXPECT_LT(Error({largest.tone}, {tones[0]}), 1e-3);
    EXPECT_NEAR(largest.offset, 7, 1e-2);
    EXPECT_NEAR(largest.residualRms, std::sqrt((1 + 0.25) / 2), 1e-3);
    const Single weaker = MeasureOne(y, 300, 100, 1e-3);
    EXPECT_EQ(weaker.code, 0);
    EXPECT_LT(Error({weaker.tone}, {tones[2]}), 1e-9);
    EXPECT_NEAR(weaker.residualRms, std::sqrt((100 + 1) / 2.0), 0.02);
    EXPECT_LT(Error({MeasureOne(y, 120, 5, 1e-3).tone}, {tones[1]}), 1e-2);
    EXPECT_EQ(MeasureOne(y, 200, 30, 1e-3).code, ErrMeasureNotFound);
    for (const double centre : {2000.0, -2000.0, 1e300, -1e300})
        EXPECT_EQ(MeasureOne(y, centre, 30, 1e-3).code, ErrMeasureNotFound);
    EXPECT_LT(Error({MeasureOne(y, 1e308, 1.7e308, 1e-3).tone}, {tones[0]}), 1e-3);
    EXPECT_EQ(Analyse(y, 3, 1e308, 0, 1e3).code, ErrMeasureNotFound);

    // More larger tones than can be fitted together.
    Tones many;
    for (int k = 1; k <= 40; ++k)
        many.push_back({0.01 * k, 1.0 + k, 0.3 * k});
    many.push_back({0.46, 0.5, 1});
    EXPECT_LT(Error({MeasureOne(Sampled(many, 4000), 0.46, 0.01).tone}, {many[40]}), 5e-2);
}

TEST(Harmonics, AreMeasuredAtTheirAliases) {
    constexpr double dt = 1e-3;
    Tones tones = {{91.3, 2, 0.4}, {2 * 91.3, 0.02, 1}, {3 * 91.3, 0.01, -2}};
    for (int h = 4; h <= 9; ++h)
        tones.push_back({h * 91.3, 1e-3 * h, 0.3 * h});
    const Samples y = Sampled(tones, 2000, dt, 0.1);
    const Analysis a = Analyse(y, 9, 0, 4, dt);
    ASSERT_EQ(a.code, 0);
    double squares = 0;
    for (int h = 1; h <= 9; ++h) {
        const Tone &tone = tones[static_cast<std::size_t>(h - 1)];
        const Tone &seen = a.harmonics[static_cast<std::size_t>(h - 1)];
        // Above half the sampling rate the phase of the alias runs backwards.
        const double folded = tone.frequency > 500 ? 1000 - tone.frequency : tone.frequency;
        const double phase = tone.frequency > 500 ? -tone.phase : tone.phase;
        EXPECT_LT(Error({seen}, {{folded, tone.amplitude, phase}}), 1e-9) << h;
        squares += h > 1 ? tone.amplitude * tone.amplitude : 0;
    }
    EXPECT_NEAR(a.thd, std::sqrt(squares) / 2, 1e-9);
    double left = 0;
    for (const double value : Sampled(Tones(tones.begin() + 1, tones.end()), 2000, dt))
        left += value * value / 2000;
    EXPECT_NEAR(a.sinad, 10 * std::log10(2 / left), 1e-9);
    EXPECT_NEAR(a.sfdr, 40, 1e-6);
    EXPECT_NEAR(a.enob, (a.sinad + 20 * std::log10(2.0) - 1.7609) / 6.0206, 1e-12);
    EXPECT_GT(a.snr, 250);

    // A fundamental above the sampling rate aliases to the same frequencies.
    const Analysis above = Analyse(y, 9, 1091.3, 4, dt);
    ASSERT_EQ(above.code, 0);
    EXPECT_EQ(Error(above.harmonics, a.harmonics), 0);
    // If a weaker tone is given, that tone is measured, disturbed by the stronger one.
    EXPECT_NEAR(Analyse(y, 2, 182, 0, dt).harmonics[0].frequency, 2 * 91.3, 0.1);
    EXPECT_EQ(Analyse(y, 2, 45, 0, dt).code, ErrMeasureNotFound);
}

TEST(Harmonics, ThatCannotBeSeparatedAreNaNAndStillCount) {
    // With the fundamental at an eighth of the sampling rate, harmonics 3 and 5 coincide, 4 is at
    // half the sampling rate, 7 at the fundamental and 8 at 0.
    Samples y = Sampled({{0.125, 1, 0}, {0.25, 0.1, 1}, {0.375, 0.03, 1}}, 800);
    for (std::size_t t = 0; t < y.size(); ++t)
        y[t] += t % 2 == 0 ? 0.04 : -0.04;
    const auto areTold = [&](int32_t highest) {
        std::vector<int> told;
        const Tones harmonics = Analyse(y, highest).harmonics;
        for (std::size_t h = 0; h < harmonics.size(); ++h) {
            EXPECT_EQ(std::isnan(harmonics[h].frequency), std::isnan(harmonics[h].amplitude));
            EXPECT_EQ(std::isnan(harmonics[h].phase), std::isnan(harmonics[h].amplitude));
            if (!std::isnan(harmonics[h].amplitude))
                told.push_back(static_cast<int>(h) + 1);
        }
        return told;
    };
    EXPECT_EQ(areTold(4), (std::vector<int>{1, 2, 3}));
    EXPECT_EQ(areTold(5), (std::vector<int>{1, 2}));
    EXPECT_EQ(areTold(8), (std::vector<int>{1})); // the sixth coincides with the second
    const Analysis a = Analyse(y, 8);
    const double squares = 0.01 + 0.0009 + 2 * 0.0016;
    EXPECT_NEAR(a.thd, std::sqrt(squares), 1e-9);
    EXPECT_NEAR(a.sinad, -10 * std::log10(squares), 1e-6);
    EXPECT_GT(a.snr, 250);
}

TEST(Harmonics, OfAnIdealQuantizerHaveItsBits) {
    constexpr int32_t n = 16384;
    for (const int bits : {8, 10, 14}) {
        const double step = std::ldexp(2.0, -bits);
        Samples y = Sampled({{0.1234567, 0.999, 0.7}}, n);
        for (double &value : y)
            value = (std::floor(value / step) + 0.5) * step;
        const Analysis a = Analyse(y, 10, 0, 1);
        EXPECT_NEAR(a.enob, bits, 0.05);
    }
    // White noise of known power with one spur, not harmonic.
    Samples y = Sampled({{0.0123456789, 1, 0.7}, {0.2, 0.01, 0}}, n);
    AddNoise(y, 1e-3, 3);
    const Analysis a = Analyse(y, 5);
    const double left = 1e-6 + 0.5e-4;
    EXPECT_NEAR(a.snr, 10 * std::log10(0.5 / left), 0.1);
    EXPECT_NEAR(a.sinad, a.snr, 0.02);
    EXPECT_NEAR(a.sfdr, 40, 0.02);
    EXPECT_NEAR(a.noiseFloor, -a.snr - 10 * std::log10(n / 2), 1e-9);
    EXPECT_LT(a.thd, 1e-4);
}

TEST(Tones, CodesComeInOrder) {
    const DBLArray empty, three{1, 2, inf}, four{1, 2, 1, nan}, constant{3, 3, 3, 3, 3},
        few{1, 2, 3};
    const auto multiple = [](const DBLArray &y, double dt, int32_t count, int32_t order) {
        DBLArray frequencies{1}, amplitudes{1}, phases{1};
        double rms = 0;
        const ErrorCode code =
            MultipleToneMeasurements(y.handle(), dt, count, order, frequencies.handle(),
                                     amplitudes.handle(), phases.handle(), &rms);
        EXPECT_EQ(frequencies.size() + amplitudes.size() + phases.size(), 0);
        EXPECT_TRUE(std::isnan(rms));
        return code;
    };
    EXPECT_EQ(multiple(empty, 0, 0, 2), ErrMeasureEmpty);
    for (const double dt : {0.0, -1.0, inf, nan})
        EXPECT_EQ(multiple(three, dt, 0, 2), ErrSamplingNotPositive);
    EXPECT_EQ(multiple(three, 1, 0, 2), ErrMeasureBadCount);
    EXPECT_EQ(multiple(three, 1, 1, 2), ErrInvalidSelector);
    EXPECT_EQ(multiple(three, 1, 1, -1), ErrInvalidSelector);
    EXPECT_EQ(multiple(three, 1, 1, 1), ErrNonFiniteInput);
    EXPECT_EQ(multiple(few, 1, 1, 1), ErrMeasureTooFewPoints);
    EXPECT_EQ(multiple(constant, 1, 1, 1), ErrMeasureNotFound);

    EXPECT_EQ(MeasureOne({1, 2, 1, nan}, 0, 0, 0).code, ErrSamplingNotPositive);
    EXPECT_EQ(MeasureOne({1, 2, 1, nan}).code, ErrNonFiniteInput);
    EXPECT_EQ(MeasureOne({1, 2, 1}, nan).code, ErrNonFiniteInput);
    EXPECT_EQ(MeasureOne({1, 2, 1}, 0, inf).code, ErrNonFiniteInput);
    EXPECT_EQ(MeasureOne({1, 2, 1}).code, ErrMeasureTooFewPoints);

    const Samples y = Sampled({{0.1, 1, 0}}, 20);
    EXPECT_EQ(Analyse(y, 0, nan).code, ErrMeasureBadCount);
    EXPECT_EQ(Analyse(y, 10, nan).code, ErrNonFiniteInput);
    EXPECT_EQ(Analyse(y, 1, 0, inf).code, ErrNonFiniteInput);
    EXPECT_EQ(Analyse(y, 10).code, ErrMeasureTooFewPoints);
    EXPECT_EQ(Analyse(y, 2147483647).code, ErrMeasureTooFewPoints);
    EXPECT_EQ(Analyse(y, 9).code, 0);
    EXPECT_EQ(Analyse({2, 2, 2, 2, 2}, 1).code, ErrMeasureNotFound);
}

} // namespace
} // namespace qx::test
