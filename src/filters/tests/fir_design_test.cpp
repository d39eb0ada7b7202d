#include "qx/fir_design.h"

#include "filters/remez.h"
#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/table.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <cstring>
#include <limits>
#include <numbers>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Signal;
typedef std::complex<double> Complex;

constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double pi = std::numbers::pi;

// The response without its delay: real for symmetric taps, imaginary for antisymmetric ones.
Complex Response(const Signal &h, double frequency) {
    const Complex z = std::polar(1.0, -2 * pi * frequency);
    Complex sum = 0.0;
    for (std::size_t i = h.size(); i-- > 0;)
        sum = sum * z + h[i];
    return sum * std::polar(1.0, pi * frequency * (static_cast<double>(h.size()) - 1));
}

struct CutOff {
    double fs, fl, fh;
    int32_t taps, type;
    ErrorCode err = 99;

    Signal values() {
        const DBLArray h(Signal(3, 7.0));
        EXPECT_EQ(FIRCoefs(&fs, &fl, &fh, &taps, h.handle(), &type, &err), 0);
        return h.values();
    }
};

TEST(FIRCoefs, AreTheFourierSeriesOfTheIdealResponse) {
    ResetHost();
    for (const int32_t taps : {1, 6, 7, 40, 1001})
        for (int32_t type = 0; type < 4; ++type) {
            if (taps % 2 == 0 && type % 2 == 1)
                continue;
            CutOff design = {48000, 3000, 10800, taps, type};
            const Signal h = design.values();
            ASSERT_EQ(design.err, 0);
            // The integral over the pass bands of cos(2 pi f (i - c)), twice.
            const double low = 3000.0 / 48000, high = 10800.0 / 48000;
            const std::vector<std::pair<double, double>> bands[4] = {
                {{0, low}}, {{low, 0.5}}, {{low, high}}, {{0, low}, {high, 0.5}}};
            for (int32_t i = 0; i < taps; ++i) {
                const long double t = i - (taps - 1) / 2.0L;
                const long double w = 2 * std::numbers::pi_v<long double> * t;
                long double expected = 0;
                for (const auto &[from, to] : bands[type])
                    expected += t == 0 ? 2.0L * (to - from)
                                       : 2 * (std::sin(w * to) - std::sin(w * from)) / w;
                ASSERT_NEAR(h[static_cast<std::size_t>(i)], static_cast<double>(expected),
                            4e-15 * taps)
                    << taps << " " << type << " " << i;
            }
        }
}

TEST(FIRCoefs, ClampsTheTypeAndRefusesImpossibleDesigns) {
    ResetHost();
    for (const auto &[type, clamped] : {std::pair{9, 3}, {-4, 0}, {2, 2}}) {
        CutOff design = {1, 0.1, 0.2, 9, type};
        EXPECT_EQ(design.values().size(), 9U);
        EXPECT_EQ(design.type, clamped);
    }
    const struct {
        CutOff design;
        ErrorCode code;
    } cases[] = {
        {{1, 0.1, 0.2, 0, 0}, ErrOrderNotPositive}, {{1, 0.6, 0.2, 9, 0}, ErrAboveNyquist},
        {{1, 0.1, 0.6, 9, 2}, ErrAboveNyquist},     {{1, 0.0, 0.2, 9, 0}, ErrBadCutoff},
        {{0, -0.1, 0.2, 9, 1}, ErrBadCutoff},       {{1, 0.2, 0.2, 9, 3}, ErrBadCutoff},
        {{1, 0.1, 0.2, 8, 1}, ErrBadTapCount},      {{1, 0.1, 0.2, 8, 3}, ErrBadTapCount},
        {{1, 0.1, 0.6, 8, 3}, ErrAboveNyquist},     {{1, 0.3, 0.2, 8, 3}, ErrBadCutoff},
    };
    CutOff none = {1, 0.1, 0.2, 0, 7}; // the taps are checked before the type is clamped
    none.values();
    EXPECT_EQ(none.type, 7);
    for (const auto &[design, code] : cases) {
        CutOff copy = design;
        EXPECT_TRUE(copy.values().empty());
        EXPECT_EQ(copy.err, code) << design.type << " " << design.fl << " " << design.taps;
    }
}

struct Equiripple {
    int32_t n, kind;
    std::vector<RemezBand> bands;
    double fs = 1.0;
    int32_t maxIterations = 0;
    double ripple = 5.0;
    ErrorCode err = 99;
    int32_t status = 99;

    Signal taps() {
        const std::size_t bytes = bands.size() * sizeof(RemezBand);
        const Array1D<qx::ElementType::U8> records(static_cast<int32_t>(bytes));
        if (bytes > 0)
            std::memcpy(records.data(), bands.data(), bytes);
        (*records.handle())->dimSize = static_cast<int32_t>(bands.size());
        const DBLArray h(Signal(3, 7.0));
        status = Parks(&n, &fs, reinterpret_cast<RemezBand1D>(records.handle()), &kind, h.handle(),
                       &ripple, &maxIterations, &err);
        return h.values();
    }
};

// The largest weighted deviation from the desired response at the points of the design.
double PeakOnGrid(const Signal &h, const Equiripple &design) {
    const bool isOdd = design.n % 2 != 0, isMultiband = design.kind == 0;
    const double step = 0.5 / (16 * (design.n / 2 + (isOdd && isMultiband)));
    double peak = 0;
    for (const RemezBand &band : design.bands) {
        const double from = isMultiband ? +band.fLow : std::max(+band.fLow, step);
        const auto steps = static_cast<int>((band.fHigh - from) / step);
        for (int k = 0; k <= steps; ++k) {
            const double f = k < steps ? from + k * step : +band.fHigh;
            if (isMultiband != isOdd && f > 0.5 - step)
                continue;
            const Complex at = Response(h, f);
            const double gain = isMultiband ? at.real() : at.imag();
            const double slope = design.kind == 1 ? f : 1.0;
            peak = std::max(peak, std::fabs(gain - band.desired * slope) * band.weight / slope);
        }
    }
    return peak;
}

TEST(Parks, ReachesWhatSciPyReaches) {
    ResetHost();
    for (const TableRow &row : ReadTable(TestData("remez.dat"))) {
        const auto &v = row.arguments;
        Equiripple design = {static_cast<int32_t>(v[1]), static_cast<int32_t>(v[0]), {}};
        for (std::size_t i = 2; i + 3 < v.size(); i += 4)
            design.bands.push_back({v[i], v[i + 1], v[i + 2], v[i + 3]});
        const Signal h = design.taps();
        ASSERT_EQ(design.err, 0) << row.text;
        const double peak = PeakOnGrid(h, design);
        EXPECT_NEAR(peak, row.value, 1e-6 * row.value + 1e-11) << row.text;
        // The exchange may miss an extremum that is only slightly larger.
        EXPECT_NEAR(design.ripple, peak, 2e-3 * peak) << row.text;
        for (std::size_t i = 0; i < h.size(); ++i)
            ASSERT_EQ(h[i], design.kind == 0 ? h[h.size() - 1 - i] : -h[h.size() - 1 - i]);
    }
}

TEST(Parks, IsTheBestInClosedForm) {
    ResetHost();
    // h[1] + 2 h[0] cos(w): the best line for two bands with |cos| from c to 1 and desired values 1
    // and 0.
    Equiripple three = {3, 0, {{1, 0, 200, 1}, {0, 800, 1000, 1}}, 2000};
    const Signal h = three.taps();
    const double c = std::cos(pi * 0.2), slope = 1 / (1 + c);
    EXPECT_NEAR(h[1], 0.5, 1e-15);
    EXPECT_NEAR(h[0], slope / 2, 1e-15);
    EXPECT_NEAR(three.ripple, slope * (1 - c) / 2, 1e-15);
    // A Hilbert transformer of three taps: for the best h, 2 h sin(w) has equal deviations from 1
    // at both extremes.
    Equiripple hilbert = {3, 2, {{1, 0.125, 0.375, 1}}};
    const double low = std::sin(2 * pi * 0.125);
    EXPECT_NEAR(std::fabs(hilbert.taps()[0]), 1 / (1 + low), 1e-15);
    EXPECT_NEAR(hilbert.ripple, (1 - low) / (1 + low), 1e-15);
}

// With few grid points, the result shows which points the grid has at its ends.
TEST(Parks, BandsEndAtTheirEdgesAndBeforeAForcedZero) {
    ResetHost();
    // A band of exactly one step has both its edges as points (cosines 1 and c), a narrower band
    // only its upper edge (cosine -1).
    Equiripple step = {3, 0, {{1, 0, 1.0 / 64, 1}, {0, 0.495, 0.5, 1}}};
    const double c = std::cos(2 * pi / 64);
    EXPECT_EQ(step.taps().size(), 3U);
    EXPECT_NEAR(step.ripple, (1 - c) / 4, 1e-15);
    // The point at 0.49 is within a step, 1/32, of the zero at 0.5; the one before it is at 0.4375.
    Equiripple hilbert = {3, 2, {{1, 0.125, 0.49, 1}}};
    const double low = std::sin(2 * pi * 0.4375);
    EXPECT_NEAR(std::fabs(hilbert.taps()[0]), 1 / (1 + low), 1e-15);
    EXPECT_NEAR(hilbert.ripple, (1 - low) / (1 + low), 1e-15);
}

TEST(Parks, IsCountedAndLimited) {
    ResetHost();
    const std::vector<RemezBand> lowpass = {{1, 0, 0.2, 1}, {0, 0.25, 0.5, 1}};
    Equiripple usual = {41, 0, lowpass}, hundred = {41, 0, lowpass, 1, 100};
    EXPECT_EQ(usual.taps(), hundred.taps());
    EXPECT_EQ(usual.ripple, hundred.ripple);
    // One round gives no result; after a few, the deviation is still below the final one.
    Equiripple one = {41, 0, lowpass, 1, 1}, few = {41, 0, lowpass, 1, 4};
    EXPECT_TRUE(one.taps().empty() && few.taps().empty());
    EXPECT_EQ(one.err, ErrBadDesignField);
    EXPECT_EQ(few.err, ErrBadDesignField);
    EXPECT_TRUE(std::isnan(one.ripple));
    EXPECT_GT(few.ripple, 0.5 * usual.ripple);
    EXPECT_LT(few.ripple, usual.ripple);
    // Long filters, whose products of distances exceed the range of doubles, and the limit of the
    // length.
    Equiripple longest = {2501, 0, {{1, 0, 0.2, 1}, {0, 0.2005, 0.5, 1}}};
    EXPECT_EQ(longest.taps().size(), 2501U);
    EXPECT_EQ(longest.err, 0);
    Equiripple beyond = {4093, 0, lowpass};
    EXPECT_TRUE(beyond.taps().empty());
    EXPECT_EQ(beyond.err, ErrOutOfMemory);
    EXPECT_EQ(beyond.status, 2);
    // More bands than points: the grid has two points in each band.
    Equiripple crowded = {5, 0, {}};
    for (int b = 0; b < 400; ++b)
        crowded.bands.push_back({b < 200 ? 1.0 : 0.0, b / 800.0, (b + 0.5) / 800.0, 1});
    crowded.bands.back().fHigh = 0.5;
    EXPECT_EQ(crowded.taps().size(), 5U);
    EXPECT_NEAR(crowded.ripple, 0.5, 0.1); // of a step without a transition band
}

// Two clusters of points: products far below the smallest double in one cluster, and far above the
// largest on the way to the other.
TEST(Parks, MultipliesDistancesBeyondTheRangeOfADouble) {
    constexpr int32_t n = 2041;
    Signal x, product(n);
    std::vector<int32_t> exponent(n);
    for (int j = 0; j < n; ++j)
        x.push_back((j < n * 3 / 5 ? 1 : -1) * (1 - 1e-6 * j));
    qx::MultiplyDistances({x.data(), n, product.data(), exponent.data()});
    for (std::size_t j = 0; j < x.size(); j += 37) {
        long double logarithm = 0, sign = 1;
        for (std::size_t k = 0; k < x.size(); ++k)
            if (k != j) {
                const long double distance = static_cast<long double>(x[j]) - x[k];
                logarithm += std::log2(std::fabs(distance));
                sign *= distance < 0 ? -1 : 1;
            }
        ASSERT_NEAR(std::log2(std::fabs(product[j])) + exponent[j], static_cast<double>(logarithm),
                    1e-6);
        ASSERT_EQ(std::signbit(product[j]), sign < 0);
    }
}

TEST(Parks, RefusesImpossibleDesignsInOrder) {
    ResetHost();
    const RemezBand pass = {1, 0, 0.2, 1}, stop = {0, 0.3, 0.5, 1};
    const struct {
        Equiripple design;
        ErrorCode code;
    } cases[] = {
        {{0, 0, {{1, 0, infinity, 1}}}, ErrBadDesignField},
        {{0, 0, {}, infinity}, ErrBadDesignField},
        {{0, 0, {}}, ErrOrderNotPositive},
        {{9, 0, {}}, ErrBadCutoff},
        {{2, 0, {{-1, 0, 0.2, 1}, stop}}, ErrBadDesignField},
        {{9, 0, {pass, stop}, nan}, ErrBadDesignField},
        {{9, 0, {pass, stop}, 0}, ErrBadCutoff},
        {{9, 0, {{1, -0.1, 0.2, 1}, {0, nan, 0.5, 1}}}, ErrBadCutoff},
        {{9, 0, {{1, 0, 0.2, 0}, {0, nan, 0.5, 1}}}, ErrBadDesignField},
        {{9, 0, {{nan, 0, 0.2, 0}, stop}}, ErrBadCutoff},
        {{9, 0, {{nan, 0, 0.2, 1}, stop}}, ErrBadDesignField},
        {{9, 0, {{-1, 0, 0.2, 1}, stop}}, ErrBadCutoff},
        {{9, 0, {{1, 0.2, 0.1, 1}, {0, 0.3, 0.6, 1}}}, ErrAboveNyquist},
        {{9, 0, {{1, 0, 0.3, 1}, stop}}, ErrBadCutoff},
        {{9, 0, {{1, 0.1, 0.2, 1}, stop}}, ErrBadDesignField},
        {{9, 0, {pass, {0, 0.3, 0.498, 1}}}, ErrBadDesignField},
        {{8, 0, {{0, 0, 0.2, 1}, {1, 0.3, 0.5, 1}}}, ErrBadTapCount},
        {{9, 1, {{1, 0.1, 0.4, 1}}}, ErrBadDesignField},
        {{9, 1, {{1, 0, 0.495, 1}}}, ErrBadDesignField},
        {{8, 1, {{1, 0, 0.498, 1}}}, ErrBadDesignField},
        {{9, 2, {{1, 0, 0.4, 1}}}, ErrBadDesignField},
        {{9, 2, {{1, 0.1, 0.4995, 1}}}, ErrBadDesignField},
        {{8, 2, {{1, 0.1, 0.498, 1}}}, ErrBadDesignField},
        {{9, 3, {pass, stop}}, ErrBadDesignField},
        {{41, 0, {{1, 0, 0.0001, 1}, {0, 0.4999, 0.5, 1}}}, ErrBadDesignField},
        {{3, 2, {{1, 0.48, 0.49, 1}}}, ErrBadDesignField},
        // Weights that vanish with the factor of the symmetry.
        {{12, 0, {pass, {0, 0.3, 0.5, 5e-324}}}, ErrBadDesignField},
        {{11, 2, {{1, 0.05, 0.45, 5e-324}}}, ErrBadDesignField},
    };
    for (std::size_t i = 0; i < std::size(cases); ++i) {
        Equiripple design = cases[i].design;
        EXPECT_TRUE(design.taps().empty()) << i;
        EXPECT_EQ(design.err, cases[i].code) << i;
        EXPECT_EQ(design.status, 0) << i;
        EXPECT_TRUE(std::isnan(design.ripple)) << i;
    }
}

// Narrow bands.

struct Goal {
    double fs, fPass, fStop, fCenter;
    int32_t type;
    double ripple = 0.02, attenuation = 50;
};

struct Narrow {
    DBLArray model{Signal(2, 7.0)}, interpolator{Signal(3, 7.0)};
    NarrowFIRDesign design{};
    ErrorCode err = 99;

    explicit Narrow(const Goal &g) {
        design = {99, 99, model.handle(), interpolator.handle()};
        EXPECT_EQ(FIRNarrowCoef_head(&g.fs, &g.fPass, &g.fStop, &g.fCenter, &g.ripple,
                                     &g.attenuation, &g.type, &design, &err),
                  0);
    }
    Narrow(int32_t kind, int32_t M, const Signal &m, const Signal &i) : model(m), interpolator(i) {
        design = {kind, M, model.handle(), interpolator.handle()};
    }
    Signal filtered(const Signal &x) {
        const DBLArray in(x), out(Signal(3, 7.0));
        EXPECT_EQ(FIRnarrowFilter_head(in.handle(), &design, out.handle(), &err), 0);
        return out.values();
    }
};

bool Passes(const Goal &g, double f) {
    const double away = std::fabs(f - g.fCenter);
    return g.type == 0   ? f <= g.fPass
           : g.type == 1 ? f >= g.fPass
           : g.type == 2 ? away <= g.fPass / 2
                         : away >= g.fPass / 2;
}
bool Stops(const Goal &g, double f) {
    const double away = std::fabs(f - g.fCenter);
    return g.type == 0   ? f >= g.fStop
           : g.type == 1 ? f <= g.fStop
           : g.type == 2 ? away >= g.fStop / 2
                         : away <= g.fStop / 2;
}

// Centres over the whole range make the wanted image the first, the last or one in between, on
// either side of the model's axis.
std::vector<Goal> NarrowGoals() {
    std::vector<Goal> goals = {{1, 0.01, 0.012, 0, 0},           {1, 0.488, 0.49, 0, 0},
                               {1, 0.49, 0.488, 0, 1},           {1, 0.012, 0.010, 0, 1},
                               {8000, 1500, 1900, 0, 0},         {8000, 2600, 2300, 0, 1},
                               {8000, 320, 420, 0, 0, 0.01, 60}, {1, 0.03, 0.036, 0, 0}};
    for (double center = 0.02; center < 0.49; center += 0.0235)
        for (const int32_t type : {2, 3})
            goals.push_back(type == 2 ? Goal{1000, 10, 14, 1000 * center, 2}
                                      : Goal{1000, 14, 10, 1000 * center, 3});
    return goals;
}

TEST(NarrowFIR, KeepsItsPromisesWithFewTaps) {
    ResetHost();
    int32_t stretches = 0;
    for (const Goal &goal : NarrowGoals()) {
        Narrow narrow(goal);
        ASSERT_EQ(narrow.err, 0) << goal.type << " " << goal.fPass << " " << goal.fCenter;
        const Signal h = narrow.filtered({1.0});
        const double stop = std::pow(10, -goal.attenuation / 20);
        double worstPass = 0, worstStop = 0;
        for (int k = 0; k <= 1500; ++k) {
            const double f = k / 3000.0 * goal.fs;
            const double gain = std::abs(Response(h, f / goal.fs));
            if (Passes(goal, f))
                worstPass = std::max(worstPass, std::fabs(gain - 1));
            if (Stops(goal, f))
                worstStop = std::max(worstStop, gain);
        }
        EXPECT_LT(worstPass, goal.ripple) << goal.type << " " << goal.fPass << " " << goal.fCenter;
        EXPECT_LT(worstStop, 1.01 * stop) << goal.type << " " << goal.fPass << " " << goal.fCenter;
        const auto taps = narrow.model.size() + narrow.interpolator.size();
        if (narrow.design.M > 1) {
            ++stretches;
            EXPECT_LT(taps, 0.8 * static_cast<double>(h.size()));
        } else {
            EXPECT_EQ(narrow.interpolator.size(), 0);
        }
    }
    EXPECT_GT(stretches, 40);
}

// Mirrored at a quarter of the sampling rate, a band needs the same filters, with an interpolator
// that passes the last image instead of the first.
TEST(NarrowFIR, NeedsAsManyTapsAtEitherEnd) {
    ResetHost();
    for (const double center : {15.0, 22.0, 30.0, 41.0, 55.0, 70.0}) {
        const Narrow low(Goal{1000, 10, 14, center, 2}), high(Goal{1000, 10, 14, 500 - center, 2});
        EXPECT_GT(low.design.M, 1);
        EXPECT_EQ(low.design.M, high.design.M) << center;
        EXPECT_EQ(low.model.size(), high.model.size()) << center;
        EXPECT_EQ(low.interpolator.size(), high.interpolator.size()) << center;
    }
}

TEST(NarrowFIR, FiltersByStretchedModelAndInterpolator) {
    ResetHost();
    const Signal x = {1.0, -2.0, 0.5, 3.0}, model = {1.0, 4.0, -2.0}, smooth = {0.5, 0.25, -1.0};
    for (const int32_t M : {1, 2, 5})
        for (int32_t kind = 0; kind < 6; ++kind) {
            Narrow narrow(kind, M, model, M == 1 ? Signal() : smooth);
            Signal taps(static_cast<std::size_t>(2 * M + 1));
            for (std::size_t k = 0; k < 3; ++k)
                taps[k * static_cast<std::size_t>(M)] = model[k];
            const auto convolved = [](const Signal &a, const Signal &b) {
                Signal sum(a.size() + b.size() - 1);
                for (std::size_t i = 0; i < a.size(); ++i)
                    for (std::size_t j = 0; j < b.size(); ++j)
                        sum[i + j] += a[i] * b[j];
                return sum;
            };
            Signal expected = convolved(x, taps);
            if (M > 1)
                expected = convolved(expected, smooth);
            if (kind >= 3) // adds the input, delayed to the centre of the filter
                for (std::size_t i = 0; i < x.size(); ++i)
                    expected[i + (expected.size() - x.size()) / 2] += x[i];
            EXPECT_EQ(narrow.filtered(x), expected) << M << " " << kind;

            const CDBArray in({{1, 2}, {-2, 0.5}}), out(std::vector<CDB>(1));
            ErrorCode err = 99;
            EXPECT_EQ(CxSigFIRnarrowFilter_head(in.handle(), &narrow.design, out.handle(), &err),
                      0);
            EXPECT_EQ(err, 0);
            const Signal re = narrow.filtered({1, -2}), im = narrow.filtered({2, 0.5});
            const auto z = out.values();
            ASSERT_EQ(z.size(), re.size());
            for (std::size_t i = 0; i < z.size(); ++i)
                EXPECT_TRUE(z[i].re == re[i] && z[i].im == im[i]);
        }
}

TEST(NarrowFIR, RefusesImpossibleDesigns) {
    ResetHost();
    const struct {
        Goal goal;
        ErrorCode code;
    } cases[] = {
        {{1, 0.012, 0.012, 0, 0}, ErrBadDesignField},
        {{1, 0.0, 0.01, 0, 0}, ErrBadDesignField},
        {{1, 0.1, 0.12, 0, 4}, ErrBadDesignField},
        {{1, 0.1, 0.12, 0, -1}, ErrBadDesignField},
        {{1, 0.1, 0.6, 0, 0}, ErrBadDesignField},
        {{1, 0.1, 0.12, 0, 0, 0.0}, ErrBadDesignField},
        {{1, 0.1, 0.12, 0, 0, 0.02, infinity}, ErrBadDesignField},
        {{nan, 0.1, 0.12, 0, 0}, ErrBadDesignField},
        {{1, 0.1, 0.12, 0, 0, 0.9, 0.1}, ErrBadDesignField}, // no taps at all
        {{1, 0.01, 0.014, -0.1, 2}, ErrBadCutoff},
        {{1, 0.01, 0.014, 0.6, 2}, ErrBadCutoff},
        {{1, 1e-9, 2e-9, 0, 0}, ErrOutOfMemory},
        {{1, 1e-12, 1e-9, 0.2, 2}, ErrOutOfMemory},
    };
    for (std::size_t i = 0; i < std::size(cases); ++i) {
        const Narrow narrow(cases[i].goal);
        EXPECT_EQ(narrow.err, cases[i].code) << i;
        EXPECT_EQ(narrow.design.M, 0) << i;
        EXPECT_EQ(narrow.model.size() + narrow.interpolator.size(), 0) << i;
    }

    Narrow narrow(0, 2, {1, 2}, {1});
    const DBLArray empty, y(Signal{1, 2, 3});
    ErrorCode err = 0;
    EXPECT_EQ(FIRnarrowFilter_head(empty.handle(), &narrow.design, y.handle(), &err), 0);
    EXPECT_EQ(err, ErrEmptyInput);
    EXPECT_EQ(y.values(), Signal({1, 2, 3}));
    const struct {
        int32_t M;
        Signal model, interpolator;
    } incomplete[] = {{2, {}, {1}}, {2, {1}, {}}, {1, {}, {1}}};
    for (const auto &[M, model, interpolator] : incomplete) {
        Narrow bad(0, M, model, interpolator);
        EXPECT_TRUE(bad.filtered({1, 2}).empty());
        EXPECT_EQ(bad.err, ErrEmptyInput);
    }
    Narrow huge(0, std::numeric_limits<int32_t>::max(), {1, 2, 3}, {1});
    EXPECT_TRUE(huge.filtered({1}).empty());
    EXPECT_EQ(huge.err, ErrOutOfMemory);
}

} // namespace
} // namespace qx::test
