#include "qx/qx.h"
#include "signal/patterns.h"
#include "tests/support/hostile_host.h"

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <limits>
#include <numbers>
#include <string>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Samples;
typedef long double Long;

constexpr Long longPi = 3.141592653589793238462643383279502884L;
constexpr double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();
const DBLArray table{0.5, -1.0, 2.0, 4.0, -3.0, 1.25, 0.0};

// A continuous wave and its value at a phase in [0, 360) in long double.
struct Wave {
    std::string name;
    std::function<ErrorCode(DBLArray &x, int32_t n, double f, double &phase)> generate;
    std::function<Long(Long phase)> value;
};
constexpr double amp = 1.75;
constexpr double duty = 30.0;

Long FromTable(Long phase, bool isInterpolated) {
    const Long r = phase / 360 * table.size();
    const auto i = static_cast<int32_t>(r);
    const Long before = table[i];
    const Long behind = table[(i + 1) % table.size()];
    return amp * (isInterpolated ? before + (r - i) * (behind - before) : before);
}

template <class Export, class... More>
ErrorCode Call(Export wave, DBLArray &x, int32_t n, double f, double &phase, More... more) {
    ErrorCode err = 1;
    EXPECT_EQ(wave(x.handle(), &n, &amp, &f, &phase, more..., &err), 0);
    return err;
}

const std::vector<Wave> &Waves() {
    static const std::vector<Wave> waves = {
        {"sine", [](auto &&...a) { return Call(SineWaveCIN, a...); },
         [](Long p) { return amp * std::sin(p * longPi / 180); }},
        {"square", [](auto &&...a) { return Call(SquareWaveCIN, a..., &duty); },
         [](Long p) { return p < 3.6L * duty ? amp : -amp; }},
        {"triangle", [](auto &&...a) { return Call(TriangleWaveCIN, a...); },
         [](Long p) { return amp * 2 / longPi * std::asin(std::sin(p * longPi / 180)); }},
        {"sawtooth", [](auto &&...a) { return Call(SawtoothWaveCIN, a...); },
         [](Long p) { return amp * (p < 180 ? p / 180 : p / 180 - 2); }},
        {"table",
         [](auto &&...a) {
             static const int32_t no = 0;
             return Call(ArbitraryWaveCIN, a..., table.handle(), &no);
         },
         [](Long p) { return FromTable(p, false); }},
        {"interpolated table",
         [](auto &&...a) {
             static const int32_t yes = 1;
             return Call(ArbitraryWaveCIN, a..., table.handle(), &yes);
         },
         [](Long p) { return FromTable(p, true); }},
    };
    return waves;
}

Long Reduced(Long phase) {
    const Long rest = std::fmod(phase, 360.0L);
    return rest < 0 ? rest + 360 : rest;
}

// The phases avoid the jumps, where the last bit would decide.
TEST(Waves, FollowTheirPhase) {
    for (const Wave &wave : Waves())
        for (const double f : {0.0123456, -0.0123456, 0.4001, 2.25, -7.12, 0.0})
            for (const double from : {0.0, 77.7, -30.1, 1234.5}) {
                SCOPED_TRACE(wave.name + ", f " + std::to_string(f));
                constexpr int32_t n = 203;
                DBLArray x;
                double phase = from;
                ASSERT_EQ(wave.generate(x, n, f, phase), 0);
                ASSERT_EQ(x.size(), n);
                EXPECT_NEAR(std::remainder(phase - (from + 360 * f * n), 360.0), 0.0, 5e-9);
                EXPECT_GE(phase, 0.0);
                EXPECT_LT(phase, 360.0);
                for (int32_t i = 0; i < n; ++i) {
                    const Long p = Reduced(from + 360.0L * f * i);
                    const Long value = wave.value(p);
                    if (std::fabs(wave.value(Reduced(p + 1e-9L)) - wave.value(Reduced(p - 1e-9L))) >
                        1e-6L)
                        continue;
                    ASSERT_NEAR(x[i], static_cast<double>(value), 3e-10) << i;
                }
            }
}

// Blocks of any size give the wave of one block, except for the rounding of the phase between
// blocks, which the tables magnify.
TEST(Waves, BlocksJoinWithoutASeam) {
    for (const Wave &wave : Waves()) {
        SCOPED_TRACE(wave.name);
        const double f = 0.01 / 3;
        double wholePhase = 12.3;
        DBLArray whole;
        ASSERT_EQ(wave.generate(whole, 6000, f, wholePhase), 0);
        double phase = 12.3;
        int32_t i = 0;
        for (int32_t n = 1; i + n <= whole.size(); i += n, n = n % 97 + 1) {
            DBLArray block;
            ASSERT_EQ(wave.generate(block, n, f, phase), 0);
            for (int32_t k = 0; k < n; ++k)
                ASSERT_NEAR(block[k], whole[i + k], 1e-9) << i + k;
        }
        EXPECT_GT(i, 5900);
    }
}

// Periods of 64 or 160 samples: phases are exact, and vectors extend across the jumps or begin at
// them.
TEST(Waves, SlowOnesJumpAtTheExactSample) {
    const double half = 50.0;
    for (const int32_t period : {64, 160})
        for (const int32_t first : {0, 1, 5, 63}) {
            SCOPED_TRACE(testing::Message() << period << " samples from " << first);
            const double f = 1.0 / period;
            DBLArray square, triangle, sawtooth;
            for (const double turns : {0.0, 3.0}) {
                const double from = 360.0 * (turns + first * f);
                double phases[3] = {from, from, from};
                ASSERT_EQ(Call(SquareWaveCIN, square, 1000, f, phases[0], &half), 0);
                ASSERT_EQ(Call(TriangleWaveCIN, triangle, 1000, f, phases[1]), 0);
                ASSERT_EQ(Call(SawtoothWaveCIN, sawtooth, 1000, f, phases[2]), 0);
                for (int32_t i = 0; i < 1000; ++i) {
                    const int32_t place = (first + i) % period;
                    ASSERT_EQ(square[i], 2 * place < period ? amp : -amp) << i;
                    const double p = place * (360.0 / period) / 180.0;
                    ASSERT_NEAR(sawtooth[i], amp * (2 * place < period ? p : p - 2), 1e-12) << i;
                    const double q = p < 0.5 ? p : p < 1.5 ? 1 - p : p - 2;
                    ASSERT_NEAR(triangle[i], 2 * amp * q, 1e-12) << i;
                }
            }
        }
}

// fmod is exact: phases in whole degrees give exact positions, far beyond the range in which the
// remainder of the lanes would suffice.
TEST(Waves, PhasesAreReducedExactly) {
    for (const double turns : {0.0, 1.0, -1.0, 1e6, -3e9, 1e15, -1e15, 0x1p60}) {
        DBLArray x;
        double phase = 90.0;
        Call(SawtoothWaveCIN, x, 9, turns + 0.0, phase);
        EXPECT_EQ(x[0], 90.0 * 0.005555555555555556 * amp);
        if (std::fabs(turns) < 1e12) {
            for (int32_t i = 1; i < 9; ++i)
                EXPECT_EQ(x[i], x[0]) << turns;
            EXPECT_EQ(phase, 90.0);
        }
        double start = 360.0 * turns + 180.0;
        const double reduced = std::fmod(start, 360.0);
        Call(SawtoothWaveCIN, x, 3, 0.0, start);
        EXPECT_EQ(start, reduced < 0 ? reduced + 360.0 : reduced) << turns;
        EXPECT_EQ(x[2], x[0]);
    }
    DBLArray x;
    double phase = 180.0;
    Call(SawtoothWaveCIN, x, 1, 0.0, phase);
    EXPECT_EQ(x[0], -amp);
    // Both ways of reducing a phase, with a phase that only the exact way can reduce.
    for (int32_t i = 0; i < 40; ++i) {
        double slow = i * 10.0 + 360.0 * 0x1p45;
        double fast = i * 10.0;
        DBLArray y;
        Call(TriangleWaveCIN, x, 5, 0.0, fast);
        Call(TriangleWaveCIN, y, 5, 0.0, slow);
        EXPECT_EQ(x.values(), y.values());
    }
}

TEST(Waves, SineIsClipped) {
    // At multiples of a quarter turn the recurrence reaches the peak but never exceeds it.
    DBLArray x;
    double phase = 90.0;
    Call(SineWaveCIN, x, 100000, 0.0001, phase);
    double worst = 0.0;
    for (int32_t i = 0; i < x.size(); ++i) {
        ASSERT_LE(std::fabs(x[i]), amp);
        const Long exact = amp * std::cos(2 * longPi * 0.0001L * i);
        worst = std::max(worst, static_cast<double>(std::fabs(x[i] - exact)));
    }
    EXPECT_LT(worst, 2.4e-13);
    for (const int32_t n : {1, 2, 3}) {
        phase = 30.0;
        Call(SineWaveCIN, x, n, 0.1, phase);
        ASSERT_EQ(x.size(), n);
        EXPECT_NEAR(x[n - 1],
                    amp * std::sin(std::numbers::pi / 6 + 0.2 * std::numbers::pi * (n - 1)), 1e-15);
    }
}

TEST(Waves, SquareClampsItsDuty) {
    for (const auto &[percent, high] :
         {std::pair{120.0, 8}, {100.0, 8}, {50.0, 4}, {0.0, 0}, {-5.0, 0}}) {
        DBLArray x;
        double phase = 0.0;
        Call(SquareWaveCIN, x, 8, 0.125, phase, &percent);
        int32_t count = 0;
        for (const double value : x.values())
            count += value == amp;
        EXPECT_EQ(count, high);
    }
}

TEST(Waves, WholeTurnsBackAreTheStart) {
    DBLArray x;
    double phase = 0.0;
    Call(SquareWaveCIN, x, 16, -0.25, phase, &duty); // 0, 270, 180, 90
    for (int32_t i = 0; i < 16; ++i)
        EXPECT_EQ(x[i], i % 4 == 0 || i % 4 == 3 ? amp : -amp) << i;
}

TEST(Waves, TablesAreNeverReadOutside) {
    const int32_t one = 1;
    const DBLArray empty(0);
    for (const double f : {0.0, 1e-20, -1e-20, 1e10, -1e300, 0.3333})
        for (const double from : {-1e-20, -1e-300, 360.0, -360.0, 1e17, 0.0})
            for (const DBLArray *values : {&table, &empty}) {
                DBLArray x;
                double phase = from;
                EXPECT_EQ(Call(ArbitraryWaveCIN, x, 50, f, phase, values->handle(), &one), 0);
                for (const double value : x.values())
                    EXPECT_LE(std::fabs(value), 4.0 * amp);
                if (values == &empty) {
                    EXPECT_EQ(phase, 0.0);
                }
            }
    for (const auto &[f, from] :
         {std::pair{inf, 0.0}, {nan, 0.0}, {0.1, inf}, {0.1, nan}, {1e308, 0.0}}) {
        DBLArray x;
        double phase = from;
        EXPECT_EQ(Call(ArbitraryWaveCIN, x, 50, f, phase, table.handle(), &one), ErrNonFiniteInput);
        EXPECT_EQ(x.size(), 0);
    }
}

TEST(Waves, ChirpSweepsFromFirstToLastFrequency) {
    const int32_t n = 2000;
    const double f1 = 0.01;
    const double f2 = 0.2;
    DBLArray x;
    ErrorCode err = 1;
    ChirpCIN(x.handle(), &n, &amp, &f1, &f2, &err);
    EXPECT_EQ(err, 0);
    for (int32_t i = 0; i < n; ++i) {
        const Long cycles = i * (Long{f1} + (Long{f2} - f1) * i / (2 * n));
        ASSERT_NEAR(x[i], static_cast<double>(amp * std::sin(2 * longPi * cycles)), 2e-12);
    }
}

// The samples of vectors, of what they leave, and of blocks of a chirp have the bits of single ones.
TEST(Waves, VectorsGiveTheSamplesOfSingleNumbers) {
    const double duty = 30;
    for (const double f : {0.0, 0.004, 0.01, -0.01, 1.0 / 64, 0.3, -7.7})
        for (const double start : {0.0, 123.4, -200.0, 4e6})
            for (const int32_t n : {1, 2, 3, 7, 8, 9, 15, 17, 1000, 1003}) {
                SCOPED_TRACE(testing::Message() << f << ' ' << start << ' ' << n);
                DBLArray square, triangle, sawtooth;
                double phases[3] = {start, start, start};
                ASSERT_EQ(Call(SquareWaveCIN, square, n, f, phases[0], &duty), 0);
                ASSERT_EQ(Call(TriangleWaveCIN, triangle, n, f, phases[1]), 0);
                ASSERT_EQ(Call(SawtoothWaveCIN, sawtooth, n, f, phases[2]), 0);
                for (int32_t i = 0; i < n; ++i) {
                    const double rest = std::fmod(i * 360.0 * f + start, 360.0);
                    const double p = rest < 0 ? rest + 360 : rest;
                    ASSERT_EQ(square[i], p < 3.6 * duty ? amp : -amp) << i;
                    const double q = p / 180;
                    ASSERT_EQ(triangle[i], amp * 2 * (q < 0.5 ? q : q < 1.5 ? 1 - q : q - 2)) << i;
                    const double s = p * 0.005555555555555556;
                    ASSERT_EQ(sawtooth[i], (p < 180 ? s : s - 2) * amp) << i;
                }
            }
    const double f1 = 0.01, f2 = 0.2;
    for (const int32_t n : {1, 7, 9, 1023, 1024, 1025, 1033, 2048, 5000}) {
        DBLArray x;
        ErrorCode err = 1;
        ChirpCIN(x.handle(), &n, &amp, &f1, &f2, &err);
        EXPECT_EQ(err, 0);
        const double pi = std::numbers::pi, step = (f2 - f1) * pi / n;
        for (int32_t i = 0; i < n; ++i)
            ASSERT_EQ(x[i], amp * std::sin(i * (step * i + 2 * pi * f1))) << n << ' ' << i;
    }
}

TEST(Waves, FailuresLeaveThePhase) {
    for (const Wave &wave : Waves())
        for (const int32_t n : {0, -1}) {
            DBLArray x(3);
            double phase = 400.0;
            EXPECT_EQ(wave.generate(x, n, 0.1, phase), ErrEmptyInput);
            EXPECT_EQ(x.size(), 0);
            EXPECT_EQ(phase, 400.0);
        }
}

// Patterns.

template <class Export, class... More>
Samples Pattern(ErrorCode expected, Export pattern, int32_t n, More... more) {
    DBLArray x(2);
    ErrorCode err = 1;
    EXPECT_EQ(pattern(x.handle(), &n, &more..., &err), 0);
    EXPECT_EQ(err, expected);
    EXPECT_EQ(x.size(), expected == 0 ? n : 0);
    return x.values();
}

TEST(Patterns, SquareRoundsItsPeriodAndItsDuty) {
    EXPECT_EQ(Pattern(0, Square, 8, 2.0, 50.0, 2.0), (Samples{2, 2, 0, 0, 2, 2, 0, 0}));
    EXPECT_EQ(Pattern(0, Square, 8, 2.0, 34.0, 3.0), (Samples{2, 0, 0, 2, 0, 0, 2, 0}));
    EXPECT_EQ(Pattern(0, Square, 4, 2.0, 100.0, 1.0), (Samples{2, 2, 2, 2}));
    EXPECT_EQ(Pattern(0, Square, 4, 2.0, 120.0, 2.0), (Samples{2, 2, 2, 2}));
    EXPECT_EQ(Pattern(0, Square, 3, 2.0, 50.0, 1e-300), (Samples{2, 2, 2}));
    EXPECT_EQ(Pattern(0, Square, 4, 2.0, 1e-300, 2.0), (Samples{0, 0, 0, 0}));
    Pattern(ErrEmptyInput, Square, 0, 2.0, 0.0, 0.0);
    Pattern(ErrWaveParameterNotPositive, Square, 8, 2.0, 0.0, 0.0);
    Pattern(ErrWaveParameterNotPositive, Square, 8, 2.0, nan, 1.0);
    Pattern(ErrWaveParameterRange, Square, 8, 2.0, 50.0, 0.0);
    Pattern(ErrWaveParameterRange, Square, 8, 2.0, 50.0, nan);
    Pattern(ErrWaveParameterRange, Square, 9, 2.0, 50.0, 4.25);
    double y[2];
    EXPECT_EQ(qx::GenSquarePattern(1.0, 50.0, 2.5, {y, 2}), ErrWaveParameterRange);
}

TEST(Patterns, PulsesAreAtTheRequestedPositions) {
    EXPECT_EQ(Pattern(0, PulsePtrn, 5, 2.0, 1, 3), (Samples{0, 2, 2, 2, 0}));
    EXPECT_EQ(Pattern(0, PulsePtrn, 3, 2.0, 3, 0), (Samples{0, 0, 0}));
    EXPECT_EQ(Pattern(0, ImpulsePtrn, 3, 2.0, 2), (Samples{0, 0, 2}));
    Pattern(ErrEmptyInput, PulsePtrn, 0, 2.0, -1, 3);
    for (const auto &[delay, width] :
         {std::pair{-1, 2}, {1, -1}, {3, 3}, {6, 0}, {2147483647, 2147483647}})
        Pattern(ErrPulseOutOfRange, PulsePtrn, 5, 2.0, delay, width);
    for (const int32_t delay : {-1, 3})
        Pattern(ErrIndexOutOfRange, ImpulsePtrn, 3, 2.0, delay);
}

TEST(Patterns, SineAndSinc) {
    const Samples sine = Pattern(0, SinePtrn, 90, 2.0, -30.0, 2.5);
    for (int32_t i = 0; i < 90; ++i)
        EXPECT_NEAR(sine[static_cast<std::size_t>(i)],
                    2.0 * std::sin(2 * std::numbers::pi * 2.5 * i / 90 - std::numbers::pi / 6),
                    1e-13);
    const Samples sinc = Pattern(0, SincWave, 9, 2.0, 1.0, 0.25);
    EXPECT_EQ(sinc[4], 2.0);
    EXPECT_NEAR(sinc[0], 0.0, 1e-16);
    EXPECT_NEAR(sinc[2], 4 / std::numbers::pi, 1e-15);
    EXPECT_NEAR(sinc[7], 2 * std::sin(0.75 * std::numbers::pi) / (0.75 * std::numbers::pi), 1e-15);
    Pattern(ErrSamplingNotPositive, SincWave, 9, 2.0, 1.0, 0.0);
    Pattern(ErrSamplingNotPositive, SincWave, 9, 2.0, 1.0, nan);
}

TEST(Ramps, IncludeOrExcludeTheEnd) {
    EXPECT_EQ(Pattern(0, RampPtrn, 5, 1.0, 3.0), (Samples{1, 1.5, 2, 2.5, 3}));
    EXPECT_EQ(Pattern(0, RampPtrn, 1, 2.0, 2.0), Samples{2.0});
    Pattern(ErrFewerThanTwo, RampPtrn, 1, 2.0, 3.0);
    Pattern(ErrEmptyInput, RampPtrn, 0, 2.0, 2.0);
    EXPECT_EQ(Pattern(0, RampPtrn, 4, 0.1, 0.7)[3], 0.7) << "the end is exact to the bit";
    DBLArray x;
    for (const int32_t excludeEnd : {1, -1, 2}) { // any nonzero value
        EXPECT_EQ(RampPtrn80(x.handle(), 4, 1.0, 3.0, excludeEnd), 0);
        EXPECT_EQ(x.values(), (Samples{1, 1.5, 2, 2.5}));
    }
    EXPECT_EQ(RampPtrn85(x.handle(), 3, 1.0, 100.0, 0, 1), 0);
    EXPECT_EQ(x.values(), (Samples{1, 10, 100}));
    EXPECT_EQ(RampPtrn85(x.handle(), 4, 16.0, 1.0, 1, 1), 0);
    for (int32_t i = 0; i < 4; ++i)
        EXPECT_NEAR(x[i], std::ldexp(1.0, 4 - i), 1e-14);
    struct Bad {
        int32_t n;
        double start, end;
        int32_t excludeEnd, scale;
        ErrorCode code;
    };
    for (const Bad &bad : {Bad{0, 1, 2, 1, 2, ErrCountNotPositive},
                           {-3, 1, 2, 7, 0, ErrCountNotPositive},
                           {0, 1, 1, 0, 2, ErrFewerThanTwo},
                           {1, 1, 2, 0, 2, ErrFewerThanTwo},
                           {3, 1, 2, 0, 2, ErrInvalidSelector},
                           {3, 0, 2, 0, 1, ErrNotStrictlyPositive},
                           {3, nan, 2, 0, 1, ErrNotStrictlyPositive},
                           {3, 1, nan, 0, 1, ErrNotStrictlyPositive},
                           {3, 1, -2, 1, 1, ErrNotStrictlyPositive}}) {
        EXPECT_EQ(RampPtrn85(x.handle(), bad.n, bad.start, bad.end, bad.excludeEnd, bad.scale),
                  bad.code);
        EXPECT_EQ(x.size(), 0);
    }
}

// Pulses: each at uniform times, and at the same times passed by the caller.
typedef std::function<ErrorCode(DBLArray &x, int32_t n)> Pulse;

Samples AtUniformTimes(const Pulse &pulse, int32_t n) {
    DBLArray x(0);
    EXPECT_EQ(pulse(x, n), 0);
    EXPECT_EQ(x.size(), n);
    return x.values();
}
Samples AtTimes(const Pulse &pulse, const Samples &times) {
    DBLArray x(times);
    EXPECT_EQ(pulse(x, -1), 0);
    return x.values();
}
constexpr double dt = 0.125;
constexpr double delay = 1.0;
Samples Times(int32_t n) {
    Samples times;
    for (int32_t i = 0; i < n; ++i)
        times.push_back(i * dt - delay);
    return times;
}

TEST(Pulses, GaussPulseHasItsBandwidth) {
    const Pulse pulse = [](DBLArray &x, int32_t n) {
        return GaussPulseH(x.handle(), n, amp, delay, dt, 1.5, 0.4, 6.0);
    };
    const Samples x = AtUniformTimes(pulse, 21);
    EXPECT_EQ(AtTimes(pulse, Times(21)), x);
    EXPECT_EQ(x[8], amp);
    // Its envelope's spectrum is 6 dB down at half the fractional bandwidth from fc: the envelope
    // exp(-(t/s)^2) has the spectrum exp(-(pi f s)^2).
    const double fall = std::sqrt(6.0 / 20.0 * std::log(10.0));
    const double s = fall / (std::numbers::pi * 0.5 * 0.4 * 1.5);
    for (std::size_t i = 0; i < x.size(); ++i) {
        const double t = Times(21)[i];
        EXPECT_NEAR(x[i],
                    amp * std::exp(-t * t / (s * s)) * std::cos(2 * std::numbers::pi * 1.5 * t),
                    1e-14);
    }
}

TEST(Pulses, MonopulseIsADerivativeOfPeakAmp) {
    const Pulse pulse = [](DBLArray &x, int32_t n) {
        return GaussMonopulseH(x.handle(), n, dt, delay, 0.5, amp);
    };
    EXPECT_EQ(AtTimes(pulse, Times(21)), AtUniformTimes(pulse, 21));
    const double peak = 0.5 / (std::numbers::pi * 0.5);
    const double h = 1e-4;
    const Samples x = AtTimes(pulse, {-peak, 0.0, peak - h, peak, peak + h, 0.4});
    EXPECT_NEAR(x[0], -amp, 1e-15);
    EXPECT_EQ(x[1], 0.0);
    EXPECT_NEAR(x[3], amp, 1e-15);
    EXPECT_LT(x[2], x[3]);
    EXPECT_LT(x[4], x[3]);
    const auto gauss = [](double t) {
        return std::exp(-2 * t * t * std::numbers::pi * std::numbers::pi / 4);
    };
    const auto slope = [&](double t) { return (gauss(t + h) - gauss(t - h)) / (2 * h); };
    EXPECT_NEAR(x[5] / amp, slope(0.4) / slope(peak), 1e-7);
}

TEST(Pulses, TrianglesBeginAtZeroOrAreCentredOnIt) {
    const auto triangle = [](double skew, double width = 1.0) {
        return [=](DBLArray &x, int32_t n) {
            return AperiodTriangleH(x.handle(), n, 2.0, 0.25, 0.25, width, skew);
        };
    };
    EXPECT_EQ(AtUniformTimes(triangle(0.5), 7), (Samples{0, 0, 1, 2, 1, 0, 0}));
    EXPECT_EQ(AtUniformTimes(triangle(0.25), 6), (Samples{0, 0, 2, 4.0 / 3, 2.0 / 3, 0}));
    EXPECT_EQ(AtUniformTimes(triangle(0.0), 6), (Samples{0, 2, 1.5, 1, 0.5, 0}));
    EXPECT_EQ(AtUniformTimes(triangle(1.0), 7), (Samples{0, 0, 0.5, 1, 1.5, 2, 0}));
    EXPECT_EQ(AtTimes(triangle(0.5), {-0.6, -0.25, 0.0, 0.25, 0.6}), (Samples{0, 1, 2, 1, 0}));
}

// sin(N t/2) / (N sin(t/2)) is a mean of cosines, which has no singularities.
TEST(Pulses, PeriodicSincIsAMeanOfCosines) {
    for (const int32_t order : {1, 2, 5, 6}) {
        Samples times;
        for (int32_t i = -40; i <= 40; ++i)
            times.push_back(i * std::numbers::pi / 8);
        const Samples x =
            AtTimes([=](DBLArray &y,
                        int32_t n) { return PeriodicSincH(y.handle(), n, amp, order, dt, delay); },
                    times);
        for (std::size_t i = 0; i < x.size(); ++i) {
            Long sum = 0;
            for (int32_t k = 0; k < order; ++k)
                sum += std::cos((k - (order - 1) / 2.0L) * times[i]);
            EXPECT_NEAR(x[i], static_cast<double>(amp * sum / order), 3e-15)
                << order << " " << times[i];
        }
    }
    const Pulse pulse = [](DBLArray &y, int32_t n) {
        return PeriodicSincH(y.handle(), n, amp, 7, dt, delay);
    };
    const Samples x = AtUniformTimes(pulse, 21);
    EXPECT_EQ(x[8], amp);
    EXPECT_EQ(AtTimes(pulse, Times(21)), x);
}

TEST(Pulses, CodesComeInTheirOrder) {
    const auto expect = [](ErrorCode code, int32_t size, int32_t n, auto call) {
        DBLArray x(size);
        EXPECT_EQ(call(x.handle(), n), code);
        EXPECT_EQ(x.size(), 0);
    };
    const auto gauss = [](double fc, double bandwidth, double dB, double step) {
        return [=](DBL1D x, int32_t n) { return GaussPulseH(x, n, 1, 0, step, fc, bandwidth, dB); };
    };
    expect(ErrEmptyInput, 0, 0, gauss(0, 1, 1, 1));
    for (const int32_t size : {0, 2}) {
        expect(ErrNotStrictlyPositive, size, 2, gauss(0, 1, 1, 0));
        expect(ErrNotStrictlyPositive, size, 2, gauss(1, 0, 1, 0));
        expect(ErrNotStrictlyPositive, size, 2, gauss(1, 1, nan, 0));
        expect(ErrSamplingNotPositive, size, 2, gauss(1, 1, 1, 0));
        expect(ErrNotStrictlyPositive, size, 2,
               [](DBL1D x, int32_t n) { return GaussMonopulseH(x, n, 0, 0, 0, 1); });
        expect(ErrSamplingNotPositive, size, 2,
               [](DBL1D x, int32_t n) { return GaussMonopulseH(x, n, 0, 0, 1, 1); });
        expect(ErrNotStrictlyPositive, size, 2,
               [](DBL1D x, int32_t n) { return PeriodicSincH(x, n, 1, 0, 0, 0); });
        expect(ErrSamplingNotPositive, size, 2,
               [](DBL1D x, int32_t n) { return PeriodicSincH(x, n, 1, 1, 0, 0); });
        expect(ErrNotStrictlyPositive, size, 2,
               [](DBL1D x, int32_t n) { return AperiodTriangleH(x, n, 1, 0, 0, 0, -1); });
        expect(ErrSamplingNotPositive, size, 2,
               [](DBL1D x, int32_t n) { return AperiodTriangleH(x, n, 1, 0, 0, 1, -1); });
        for (const double skew : {-0.1, 1.1})
            expect(ErrProbabilityOutOfRange, size, 2,
                   [=](DBL1D x, int32_t n) { return AperiodTriangleH(x, n, 1, 0, 1, 1, skew); });
    }
}

// A constant input shifts the phase, or the frequency, of a sine. Whole turns in the accumulator
// must have no effect, whatever its state, and blocks continue where the last one ended.
TEST(Modulators, ModulateASine) {
    const double step = 1e-3;
    const double fc = 61.0;
    const double input = 25.0;
    for (const double from : {0.0, 3000.0, 6283.0, -500.0}) {
        double phase[2] = {from, from};
        double peak[2] = {-24.9, 30.0};
        double out[2];
        for (int32_t block = 0; block < 4; ++block) {
            double pm[50];
            double fm[50];
            std::fill_n(pm, 50, input);
            std::fill_n(fm, 50, input);
            EXPECT_EQ(PhasMod(50, step, &out[0], fc, pm, &peak[0], &phase[0]), 0);
            EXPECT_EQ(FreqMod(50, step, &out[1], fc, fm, &peak[1], &phase[1]), 0);
            for (int32_t i = 0; i < 50; ++i) {
                const double t = (block * 50 + i + 1) * step;
                const double carrier = 2 * std::numbers::pi * fc * t + from * step;
                ASSERT_NEAR(pm[i], std::sin(carrier + input * std::numbers::pi / 180), 1e-12);
                ASSERT_NEAR(fm[i], std::sin(carrier + 2 * std::numbers::pi * input * t), 1e-12);
            }
            // kept: the last output, and not the last input, is added.
            EXPECT_DOUBLE_EQ(out[0], phase[0] * step * 180 / std::numbers::pi + pm[49]);
            EXPECT_DOUBLE_EQ(out[1], phase[1] * step * 180 / std::numbers::pi);
        }
        EXPECT_EQ(peak[0], input) << "25 exceeds 24";
        EXPECT_EQ(peak[1], 30.0);
    }
}

TEST(Modulators, KeepTheirOddities) {
    double y[3] = {1.9, -1.2, 2.0};
    double phase = 0.0;
    double peak = 1.0;
    double out;
    // 2 pi / dt is 2 pi: the first step stays below it, so a turn is added; the second exceeds it,
    // so a turn is subtracted.
    EXPECT_EQ(PhasMod(2, 1.0, &out, 0.25, y, &peak, &phase), 0);
    EXPECT_EQ(peak, 1.0) << "1.9 and 1 have the same whole part";
    EXPECT_NEAR(phase, 2.5 * std::numbers::pi - 2 * std::numbers::pi + 0.5 * std::numbers::pi,
                1e-14);
    y[0] = -2.5;
    FreqMod(1, 1.0, &out, 0.25, y, &peak, &phase);
    EXPECT_EQ(peak, -2.5);
    phase = 0.5;
    EXPECT_EQ(PhasMod(0, 2.0, &out, 1.0, nullptr, &peak, &phase), 0);
    EXPECT_DOUBLE_EQ(out, 180.0 / std::numbers::pi) << "without samples nothing is read";
    EXPECT_EQ(FreqMod(-7, 2.0, &out, 1.0, nullptr, &peak, &phase), 0);
    EXPECT_DOUBLE_EQ(out, 180.0 / std::numbers::pi);
}

} // namespace
} // namespace qx::test
