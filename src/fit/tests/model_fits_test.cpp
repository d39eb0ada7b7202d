#include "fit/tests/least_squares.h"
#include "qx/qx.h"
#include "tests/support/heap_probe.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <limits>

namespace qx::test {
namespace {

struct Fitted {
    ErrorCode code;
    Samples p; // the coefficients
    double mse;
    Samples fit;
    int32_t iterations;
};
struct Settings {
    Samples w = {}, guess = {};
    double tolerance = 1e-14, floor = 1e-300;
    int32_t iterations = 50;
    int32_t method = 1;
};

// Both exports of a pair return the same coefficients.
void ExpectSame(const Samples &p, const Samples &q, ErrorCode code, ErrorCode other) {
    EXPECT_EQ(code, other);
    for (std::size_t i = 0; i < p.size(); ++i)
        EXPECT_TRUE(p[i] == q[i] || (std::isnan(p[i]) && std::isnan(q[i])));
}

Fitted FitExp(const Samples &x, const Samples &y, const Settings &with = {}) {
    const DBLArray inOut(y), data(y);
    Fitted result = {0, Samples(2), 0, {}, with.iterations};
    result.code = ExpFit80_head(inOut.handle(), DBLArray(x).handle(), DBLArray(with.w).handle(),
                                with.tolerance, DBLArray(with.guess).handle(),
                                static_cast<uint16_t>(with.method), &result.p[0], &result.p[1],
                                &result.mse, &result.iterations, with.floor);
    result.fit = inOut.values();
    Samples alone(2);
    int32_t iterations = with.iterations;
    const ErrorCode code = ExpFitCoef80_head(
        data.handle(), DBLArray(x).handle(), DBLArray(with.w).handle(), with.method, with.tolerance,
        DBLArray(with.guess).handle(), &alone[0], &alone[1], &iterations, with.floor);
    ExpectSame(result.p, alone, result.code, code);
    EXPECT_EQ(iterations, result.iterations);
    EXPECT_EQ(data.values(), y);
    return result;
}

Fitted FitPower(const Samples &x, const Samples &y, const Settings &with = {}) {
    const DBLArray inOut(y);
    Fitted result = {0, Samples(2), 0, {}, with.iterations};
    result.code = PowerFit_head(inOut.handle(), DBLArray(x).handle(), DBLArray(with.w).handle(),
                                with.tolerance, DBLArray(with.guess).handle(), &result.p[0],
                                &result.p[1], &result.mse, &result.iterations, with.floor);
    result.fit = inOut.values();
    Samples alone(2);
    int32_t iterations = with.iterations;
    const ErrorCode code = PowerFitCoef_head(
        DBLArray(y).handle(), DBLArray(x).handle(), DBLArray(with.w).handle(), with.tolerance,
        DBLArray(with.guess).handle(), &alone[0], &alone[1], &iterations, with.floor);
    ExpectSame(result.p, alone, result.code, code);
    return result;
}

Fitted FitLog(const Samples &x, const Samples &y, double base, const Samples &w = {}) {
    const DBLArray inOut(y);
    Fitted result = {0, Samples(2), 0, {}, 0};
    result.code = LogFit_head(inOut.handle(), DBLArray(x).handle(), DBLArray(w).handle(), base,
                              &result.p[0], &result.p[1], &result.mse);
    result.fit = inOut.values();
    Samples alone(2);
    const ErrorCode code = LogFitCoef_head(DBLArray(y).handle(), DBLArray(x).handle(),
                                           DBLArray(w).handle(), base, &alone[0], &alone[1]);
    ExpectSame(result.p, alone, result.code, code);
    return result;
}

Fitted FitPeak(const Samples &x, const Samples &y, const Settings &with = {}) {
    const DBLArray inOut(y);
    Fitted result = {0, Samples(3), 0, {}, with.iterations};
    result.code = GaussianPeakFit_head(inOut.handle(), DBLArray(x).handle(),
                                       DBLArray(with.w).handle(), with.tolerance,
                                       DBLArray(with.guess).handle(), &result.p[0], &result.p[1],
                                       &result.p[2], &result.mse, &result.iterations, with.floor);
    result.fit = inOut.values();
    Samples alone(3);
    int32_t iterations = with.iterations;
    const ErrorCode code = GaussianPeakFitCoef_head(
        DBLArray(y).handle(), DBLArray(x).handle(), DBLArray(with.w).handle(), with.tolerance,
        DBLArray(with.guess).handle(), &alone[0], &alone[1], &alone[2], &iterations, with.floor);
    ExpectSame(result.p, alone, result.code, code);
    EXPECT_EQ(iterations, result.iterations);
    return result;
}

typedef std::function<Long(const Samples &p, double x)> Model;
Long Exponential(const Samples &p, double x) { return p[0] * std::exp(Long{p[1]} * x); }
Long Power(const Samples &p, double x) { return p[0] * std::pow(Long{x}, Long{p[1]}); }
Long Peak(const Samples &p, double x) {
    const Long z = (Long{x} - p[1]) / p[2];
    return p[0] * std::exp(-z * z / 2);
}

Samples Evenly(int32_t n, double from, double to) {
    Samples x;
    for (int32_t i = 0; i < n; ++i)
        x.push_back(from + (to - from) * i / (n - 1));
    return x;
}
Samples Values(const Model &model, const Samples &p, const Samples &x, double noise) {
    Noise random(x.size());
    Samples y;
    for (const double t : x)
        y.push_back(static_cast<double>(model(p, t)) + noise * random.symmetric());
    return y;
}
Samples WeightsFor(const Samples &x) {
    Noise random(99);
    Samples w;
    for (std::size_t i = 0; i < x.size(); ++i)
        w.push_back(0.5 + random.symmetric());
    return w;
}

// The fit, its values and its MSE are consistent, and changing a coefficient by some parts in a
// million does not lower the sum of squares.
void ExpectMinimum(const Model &model, const Samples &x, const Samples &y, const Samples &w,
                   const Fitted &found, double step) {
    const auto mseAt = [&](const Samples &p) {
        return MeanSquare(y, w, [&](std::size_t i) { return model(p, x[i]); });
    };
    const Long least = mseAt(found.p);
    EXPECT_NEAR(found.mse, static_cast<double>(least), 1e-14);
    for (std::size_t i = 0; i < x.size(); i += 7)
        EXPECT_NEAR(found.fit[i], static_cast<double>(model(found.p, x[i])), 1e-14);
    for (std::size_t j = 0; j < found.p.size(); ++j)
        for (const double direction : {-step, step}) {
            Samples beside = found.p;
            beside[j] *= 1.0 + direction;
            EXPECT_LT(least, mseAt(beside)) << j;
        }
}

TEST(ModelFits, ExponentialsAndPowersAreLeastSquares) {
    const Samples x = Evenly(60, 0.2, 3.0), w = WeightsFor(x);
    for (const double sign : {1.0, -1.0})
        for (const double b : {-1.3, 0.4}) {
            const Samples truth = {sign * 2.5, b};
            for (const Samples &weights : {Samples(), w}) {
                const Samples y = Values(Exponential, truth, x, 0.02);
                const Fitted exponential = FitExp(x, y, {.w = weights});
                EXPECT_EQ(exponential.code, 0);
                EXPECT_NEAR(exponential.p[0], truth[0], 0.05);
                ExpectMinimum(Exponential, x, y, weights, exponential, 1e-6);
                const Samples z = Values(Power, truth, x, 0.02);
                const Fitted power = FitPower(x, z, {.w = weights});
                EXPECT_EQ(power.code, 0);
                EXPECT_NEAR(power.p[1], truth[1], 0.05);
                ExpectMinimum(Power, x, z, weights, power, 1e-6);
            }
        }
}

TEST(ModelFits, LineThroughLogarithms) {
    // Weighted by w y^2, over the values with the sign of the majority; zeros are left out.
    const Samples x = Evenly(25, -1.0, 2.0), w = WeightsFor(x);
    Samples y = Values(Exponential, {-1.5, 0.7}, x, 0.3);
    y[3] = 0.0;
    y[10] = 0.4;
    Rows rows;
    Samples logarithms, weights;
    for (std::size_t i = 0; i < x.size(); ++i)
        if (y[i] < 0.0) {
            rows.push_back({1.0, x[i]});
            logarithms.push_back(std::log(-y[i]));
            weights.push_back(w[i] * y[i] * y[i]);
        }
    const Solution exact = SolveNormal(rows, logarithms, weights);
    const Fitted found = FitExp(x, y, {.w = w, .guess = {7, 7}, .iterations = 123, .method = 0});
    EXPECT_EQ(found.code, 0);
    EXPECT_NEAR(found.p[0], -std::exp(static_cast<double>(exact.c[0])), 1e-14);
    EXPECT_NEAR(found.p[1], static_cast<double>(exact.c[1]), 1e-14);
    EXPECT_EQ(found.iterations, 123);

    // The oldest exports take standard deviations; 0 counts as 1.
    Samples deviations, same;
    for (std::size_t i = 0; i < x.size(); ++i) {
        deviations.push_back(i % 4);
        same.push_back(i % 4 == 0 ? 1.0 : 1.0 / static_cast<double>((i % 4) * (i % 4)));
    }
    const DBLArray inOut(y);
    double a, b, mse;
    EXPECT_EQ(ExpFit_head(inOut.handle(), DBLArray(x).handle(), DBLArray(deviations).handle(), &a,
                          &b, &mse),
              0);
    const Fitted weighted = FitExp(x, y, {.w = same, .method = 0});
    EXPECT_EQ(a, weighted.p[0]);
    EXPECT_EQ(b, weighted.p[1]);
    EXPECT_EQ(mse, weighted.mse);
    EXPECT_EQ(inOut.values(), weighted.fit);
    EXPECT_EQ(ExpFitCoef_head(DBLArray(y).handle(), DBLArray(x).handle(), &a, &b), 0);
    EXPECT_EQ(a, FitExp(x, y, {.method = 0}).p[0]);
}

TEST(ModelFits, LimitsOfGaussNewton) {
    const Samples x = Evenly(40, 0.0, 2.0), y = Values(Exponential, {2.0, 0.8}, x, 0.3);
    const Samples start = FitExp(x, y, {.method = 0}).p;
    const Fitted none = FitExp(x, y, {.iterations = -1});
    EXPECT_EQ(none.p, start);
    EXPECT_EQ(none.iterations, 0);
    const Fitted one = FitExp(x, y, {.iterations = 0});
    EXPECT_EQ(one.iterations, 1);
    EXPECT_NE(one.p, start);
    EXPECT_EQ(FitExp(x, y, {.iterations = 2}).iterations, 3);
    const Fitted done = FitExp(x, y, {.iterations = 1000});
    EXPECT_LT(done.iterations, 20);
    EXPECT_LT(done.mse, one.mse);
    // A floor above the MSE ends the fit immediately, a wide tolerance soon; 0 selects 0.0001.
    EXPECT_EQ(FitExp(x, y, {.floor = 1.0}).iterations, 0);
    EXPECT_EQ(FitExp(x, y, {.tolerance = 0.4}).iterations, 1);
    EXPECT_EQ(FitExp(x, y, {.tolerance = 0.0}).iterations,
              FitExp(x, y, {.tolerance = 0.0001}).iterations);
    EXPECT_EQ(FitExp(x, y, {.tolerance = 0.0}).p, FitExp(x, y, {.tolerance = -1.0}).p);

    // Steps that increase the MSE are allowed only in the first tenth of the limit; this path to
    // the minimum has some.
    Samples stairs(40, 0.0);
    for (int i = 0; i < 20; ++i)
        stairs[i] = 1.0;
    const Fitted early = FitExp(x, stairs, {.guess = {0.5, 2.0}, .iterations = 20});
    const Fitted late = FitExp(x, stairs, {.guess = {0.5, 2.0}, .iterations = 100});
    EXPECT_LT(early.iterations, 10);
    EXPECT_GT(early.mse, 0.13);
    EXPECT_LT(late.mse, 0.09);

    // If a step increases the MSE, the best parameters are returned.
    const Samples wild = {1.0, 5.0};
    const Fitted astray = FitExp(x, y, {.guess = wild, .iterations = 0});
    const Long atGuess = MeanSquare(y, {}, [&](std::size_t i) { return Exponential(wild, x[i]); });
    EXPECT_LE(astray.mse, static_cast<double>(atGuess));
    const Fitted near = FitExp(x, y, {.guess = {1.8, 0.9}});
    EXPECT_NEAR(near.p[0], done.p[0], 1e-6);
}

// With a small tolerance, rounding traps the iteration in a cycle of steps. The remaining rounds
// are counted without being computed, so that a large limit costs no more than a small one.
TEST(ModelFits, CyclesOfGaussNewtonCostNothing) {
    if (!HeapProbe::works())
        GTEST_SKIP();
    const Samples x = {1, 2, 3}, y = {0, 2, 9};
    for (const auto &fit : {FitExp, FitPower}) {
        const auto within = [&](int32_t limit) {
            return fit(x, y, {.tolerance = 1e-300, .iterations = limit});
        };
        const Fitted some = within(1000);
        EXPECT_GT(some.iterations, 100);
        for (const int32_t limit : {2000000, std::numeric_limits<int32_t>::max()}) {
            const HeapProbe probe;
            const Fitted many = within(limit);
            ASSERT_LT(probe.allocations(), 2000) << "each step takes memory";
            EXPECT_EQ(many.iterations - some.iterations, limit / 10 - 100);
            EXPECT_EQ(many.p, some.p);
            EXPECT_EQ(many.mse, some.mse);
            EXPECT_EQ(many.fit, some.fit);
        }
    }
}

TEST(ModelFits, Guesses) {
    const Samples x = Evenly(20, 1.0, 3.0), y = Values(Exponential, {2.0, -0.8}, x, 0.05);
    for (const auto &fit : {FitExp, FitPower}) {
        const Fitted free = fit(x, y, {.iterations = -1});
        const auto start = [&](const Samples &guess) {
            return fit(x, y, {.guess = guess, .iterations = -1});
        };
        EXPECT_EQ(start({3.0, 0.5}).code, 0);
        EXPECT_EQ(start({3.0, 0.5}).p, (Samples{3.0, 0.5}));
        EXPECT_EQ(start({3.0}).code, WarnFitIncomplete);
        EXPECT_EQ(start({3.0}).p, free.p);
        EXPECT_EQ(start({3.0, 0.5, 1.0}).code, WarnFitIncomplete);
        EXPECT_EQ(start({3.0, 0.5, 1.0}).p, (Samples{3.0, 0.5}));
        const Fitted lost = fit(x, y, {.guess = {nan, 0.5}});
        EXPECT_EQ(lost.code, 0);
        EXPECT_TRUE(std::isnan(lost.p[0]) && std::isnan(lost.mse));
        EXPECT_EQ(lost.iterations, 0);
        // A failure takes precedence over the warning.
        EXPECT_EQ(fit(x, {1, 2}, {.guess = {3.0}}).code, ErrSizeMismatch);
        EXPECT_EQ(fit(x, Samples(20, 0.0), {.guess = {3.0}}).code, ErrPolynomialOrderTooHigh);
    }
    const Samples z = Values(Peak, {2.0, 2.0, 0.5}, x, 0.05);
    const Samples free = FitPeak(x, z, {.iterations = -1}).p;
    EXPECT_EQ(FitPeak(x, z, {.guess = {1, 2, 3}, .iterations = -1}).p, (Samples{1, 2, 3}));
    EXPECT_EQ(FitPeak(x, z, {.guess = {1, 2}, .iterations = -1}).p, free);
    EXPECT_EQ(FitPeak(x, z, {.guess = {1, 2}, .iterations = -1}).code, WarnFitIncomplete);
    EXPECT_EQ(FitPeak(x, z, {.guess = {1, nan, 3}, .iterations = -1}).p, free);
    EXPECT_EQ(FitPeak(x, z, {.guess = {1, nan, 3}, .iterations = -1}).code, 0);
}

TEST(ModelFits, ChecksOfExponentialsAndPowers) {
    const Samples x = {1, 2, 3}, y = {3, 2, 1};
    for (const auto &fit : {FitExp, FitPower}) {
        EXPECT_EQ(fit(x, y, {.w = {1, 1}}).code, ErrSizeMismatch);
        EXPECT_EQ(fit({1}, {2}, {.w = {nan}}).code, ErrFewerThanTwo);
        EXPECT_EQ(fit(x, y, {.w = {0, nan, 0}}).code, ErrNonFiniteInput);
        EXPECT_EQ(fit(x, y, {.w = {0, 1, 0}}).code, ErrTooFewWeights);
        EXPECT_EQ(fit(x, y, {.w = {0, 0, 0}}).p, fit(x, y, {}).p);
        EXPECT_EQ(fit(x, {-1, 0, 2}, {}).code, ErrPolynomialOrderTooHigh);
        const Fitted failed = fit({1, infinity, 3}, y, {});
        EXPECT_EQ(failed.code, ErrNonFiniteInput);
        EXPECT_TRUE(failed.fit.empty() && std::isnan(failed.p[0]) && std::isnan(failed.p[1]) &&
                    std::isnan(failed.mse));
        EXPECT_EQ(failed.iterations, 0);
    }
    EXPECT_EQ(FitPower({1, 0, 3}, y).code, ErrNotStrictlyPositive);
    EXPECT_EQ(FitPower({1, nan, 3}, y).code, ErrNotStrictlyPositive);
    EXPECT_EQ(FitPower({1, -1, 3}, y, {.w = {0, 1, 0}}).code, ErrTooFewWeights);
    // Data whose squares overflow or underflow.
    for (const double scale : {1e-200, 1e200}) {
        const Fitted found = FitExp({0, 1}, {scale, scale * 0.5}, {.method = 0});
        EXPECT_NEAR(found.p[0] / scale, 1.0, 1e-13);
        EXPECT_NEAR(found.p[1], -std::log(2.0), 4e-13);
    }
}

TEST(ModelFits, Logarithms) {
    const Samples x = Evenly(30, 0.5, 9.0), w = WeightsFor(x);
    Samples negative;
    for (const double t : x)
        negative.push_back(-t);
    Noise noise(1);
    Samples y;
    for (const double t : x)
        y.push_back(3.0 * std::log(0.7 * t) + 0.1 * noise.symmetric());
    for (const Samples &weights : {Samples(), w}) {
        Rows rows;
        for (const double t : x)
            rows.push_back({1.0, std::log(t)});
        const Solution exact = SolveNormal(rows, y, weights);
        const auto factor = static_cast<double>(std::exp(exact.c[0] / exact.c[1]));
        for (const double base : {2.71828, 10.0, 3.0, 0.5, 2.718281828459045}) {
            const double unit = base == 2.71828 ? 1.0 : std::log(base);
            const Fitted found = FitLog(x, y, base, weights),
                         other = FitLog(negative, y, base, weights);
            EXPECT_EQ(found.code, 0);
            EXPECT_NEAR(found.p[0], static_cast<double>(exact.c[1]) * unit, 1e-13);
            EXPECT_NEAR(found.p[1], factor, 1e-13);
            const auto model = [&](std::size_t i) {
                return exact.c[1] * std::log(Long{x[i]}) + exact.c[0];
            };
            EXPECT_NEAR(found.fit[5], static_cast<double>(model(5)), 1e-13);
            EXPECT_NEAR(found.mse, static_cast<double>(MeanSquare(y, weights, model)), 1e-14);
            EXPECT_EQ(other.p[0], found.p[0]);
            EXPECT_EQ(other.p[1], -found.p[1]);
            EXPECT_EQ(other.fit, found.fit);
        }
    }
    const Fitted flat = FitLog({1, 2, 3}, {0, 0, 0}, 10.0);
    EXPECT_EQ(flat.p, (Samples{0.0, 1.0}));

    EXPECT_EQ(FitLog({1}, {1, 2}, 0.0).code, ErrSizeMismatch);
    EXPECT_EQ(FitLog({1}, {1}, 0.0).code, ErrNotStrictlyPositive);
    EXPECT_EQ(FitLog({-1}, {1}, 2.0).code, ErrFewerThanTwo);
    EXPECT_EQ(FitLog({1, -1}, {1, 1}, 2.0, {0, 1}).code, ErrTooFewWeights);
    EXPECT_EQ(FitLog({1, -1}, {1, 1}, 2.0).code, ErrMixedSigns);
    EXPECT_EQ(FitLog({1, 0}, {1, 1}, 2.0).code, ErrMixedSigns);
    EXPECT_TRUE(FitLog({1, 0}, {1, 1}, 2.0).fit.empty());
}

TEST(ModelFits, GaussianPeaksAreLeastSquares) {
    const Samples x = Evenly(50, -2.0, 4.0), w = WeightsFor(x);
    for (const double amplitude : {2.0, -2.0})
        for (const Samples &weights : {Samples(), w}) {
            const Samples y = Values(Peak, {amplitude, 0.8, 0.9}, x, 0.05);
            const Fitted found = FitPeak(x, y, {.w = weights, .iterations = 2000});
            EXPECT_EQ(found.code, 0);
            EXPECT_NEAR(found.p[0], amplitude, 0.1);
            EXPECT_NEAR(found.p[2], 0.9, 0.1);
            ExpectMinimum(Peak, x, y, weights, found, 1e-5);
        }
    // If no trial is better, the parameters are unchanged, to the bit.
    const Samples z = Values(Peak, {2.0, 0.8, 0.9}, x, 0.05);
    const Samples best = FitPeak(x, z, {.iterations = 5000}).p;
    EXPECT_EQ(FitPeak(x, z, {.guess = best, .iterations = 0}).p, best);
    // A negative deviation is the same peak.
    const Samples y = Values(Peak, {2.0, 0.8, 0.9}, x, 0.05);
    EXPECT_EQ(FitPeak(x, y, {.guess = {2, 1, -1}}).p, FitPeak(x, y, {.guess = {2, 1, 1}}).p);
    // Trials are counted, and never increase the MSE.
    double earlier = FitPeak(x, y, {.guess = {1, 0, 2}, .iterations = -1}).mse;
    for (const int32_t limit : {0, 1, 2, 5, 20}) {
        const Fitted found = FitPeak(x, y, {.guess = {1, 0, 2}, .iterations = limit});
        EXPECT_EQ(found.iterations, limit + 1);
        EXPECT_LE(found.mse, earlier);
        earlier = found.mse;
    }
}

// Exact peaks and dips, from narrower than the sample spacing to wider than the range, inside and
// outside the range.
TEST(ModelFits, TheRevisionFindsPeaksOfAnyWidth) {
    int missed = 0;
    for (const int n : {12, 40, 200})
        for (const double s : {0.7 / n, 2.0 / n, 0.1, 0.4, 1.5})
            for (const double c : {-0.3 * s, 0.03, 0.5, 0.93, 1 + 0.3 * s})
                for (const double a : {-3.0, 1e-30}) {
                    const Samples x = Evenly(n, 0, 1), truth = {a, c, s};
                    const Samples samples = Values(Peak, truth, x, 0.0);
                    const auto isSeen = [a](double y) { return std::fabs(y / a) > 1e-3; };
                    if (std::count_if(samples.begin(), samples.end(), isSeen) < 4)
                        continue; // the peak lies between the samples
                    const DBLArray y(samples);
                    Samples p(3);
                    double mse;
                    int32_t iterations = 0;
                    const ErrorCode code = GaussianPeakFit2026_head(
                        y.handle(), DBLArray(x).handle(), DBLArray(Samples{}).handle(), 0.0,
                        DBLArray(Samples{}).handle(), &p[0], &p[1], &p[2], &mse, &iterations, 0.0);
                    EXPECT_EQ(code, 0) << n << " " << s << " " << c;
                    for (std::size_t j = 0; j < 3; ++j)
                        EXPECT_NEAR(p[j] / truth[j], 1, 1e-6) << n << " " << s << " " << c;
                    const Fitted elder = FitPeak(x, samples, {.iterations = 5000});
                    missed += elder.code != 0 || std::fabs(elder.p[2] / s - 1) > 1e-6;
                }
    EXPECT_GT(missed, 30) << "the elder finds them, too";
}

TEST(ModelFits, TheRevisionTakesAbscissaeOverTheWholeRange) {
    for (const double step : {1.7e308 / 4, 0x1p-1074}) {
        Samples x, y;
        for (int i = -4; i <= 4; ++i) {
            x.push_back(i * step);
            y.push_back(std::exp(-0.5 * i * i));
        }
        double p[3], mse;
        int32_t iterations = 0;
        const ErrorCode code = GaussianPeakFit2026_head(
            DBLArray(y).handle(), DBLArray(x).handle(), DBLArray(Samples{}).handle(), 0.0,
            DBLArray(Samples{}).handle(), &p[0], &p[1], &p[2], &mse, &iterations, 0.0);
        EXPECT_TRUE(code < 0 || std::isfinite(mse)) << step << ": " << code;
    }
}

TEST(ModelFits, EstimatesOfPeaks) {
    const auto estimate = [](const Samples &x, const Samples &y) {
        return FitPeak(x, y, {.iterations = -1});
    };
    // A single peak: the estimate passes through it and its nearest neighbours of the same sign,
    // for any order of x.
    const Samples truth = {5.0, 0.1, 0.4}, x = {1.0, -1.0, 0.0, 3.0, -2.5};
    const Fitted lone = FitPeak(x, Values(Peak, truth, x, 0.0), {.iterations = 9});
    EXPECT_EQ(lone.code, 0);
    EXPECT_EQ(lone.iterations, 0);
    for (int j = 0; j < 3; ++j)
        EXPECT_NEAR(lone.p[j], truth[j], 1e-14);
    EXPECT_NEAR(lone.fit[0], static_cast<double>(Peak(truth, 1.0)), 1e-15);
    EXPECT_EQ(estimate({0, 1, 2}, {0.1, 5, 0}).code, ErrFitStartValues);
    EXPECT_EQ(estimate({0, 1, 2}, {0.1, 5, -0.1}).code, ErrFitStartValues);
    EXPECT_TRUE(estimate({0, 1, 2}, {0.1, 5, 0}).fit.empty());
    // A plateau.
    const Fitted plateau = estimate({0, 1, 2, 5, 6}, {0, 2, 2, 2, 0.1});
    EXPECT_EQ(plateau.p, (Samples{2.4, 3.0, 2.0}));
    // The estimate from logarithms is exact for samples of a peak if one is at its centre.
    const Samples at = {0.0, 0.5, -0.3, 0.7};
    const Fitted exact = estimate(at, Values(Peak, {3.0, 0.0, 0.6}, at, 0.0));
    EXPECT_NEAR(exact.p[2], 0.6, 1e-15);
    EXPECT_EQ(exact.p[1], 0.0);

    EXPECT_EQ(FitPeak({1, 2}, {1, 2}).code, ErrFewerThanThree);
    EXPECT_EQ(FitPeak({1, 2, 3}, {1, 2}).code, ErrSizeMismatch);
    EXPECT_EQ(FitPeak({1, 2, 3}, {1, 2, 1}, {.w = {1, 0, 1}}).code, ErrTooFewWeights);
    EXPECT_EQ(FitPeak({1, 2, 3}, {1, 2, 1}, {.w = {1, nan, 1}}).code, ErrNonFiniteInput);
    EXPECT_EQ(FitPeak({1, infinity, 3}, {1, 2, 1}).code, ErrNonFiniteInput);
    EXPECT_EQ(FitPeak({1, 2, 3}, {1, 2, 1}, {.guess = {1, 2, 0}}).code, ErrFitStartValues);
    EXPECT_EQ(FitPeak({2, 2, 2}, {1, 2, 1}).code, ErrFitStartValues);
}

} // namespace
} // namespace qx::test
