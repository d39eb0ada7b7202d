#include "qx/qx.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <functional>
#include <limits>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Samples;
typedef long double Long;

const double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double dt = 0.25;

// A polynomial with all coefficients 1 up to its degree, and its integral from 0.
Long Polynomial(int degree, Long t) {
    Long sum = 0;
    for (int k = degree; k >= 0; --k)
        sum = sum * t + 1;
    return sum;
}
Long ItsIntegral(int degree, Long t) {
    Long sum = 0;
    for (int k = 0; k <= degree; ++k)
        sum += std::pow(t, Long(k + 1)) / (k + 1);
    return sum;
}
Samples Sampled(int degree, int32_t n, int32_t from = 0) {
    Samples x;
    for (int32_t i = from; i < from + n; ++i)
        x.push_back(static_cast<double>(Polynomial(degree, i * Long{dt})));
    return x;
}

double Definite(const Samples &samples, int32_t rule, bool revised, double step = dt) {
    const DBLArray x(samples);
    double result = 0;
    ErrorCode err = 1;
    if (revised) {
        EXPECT_EQ(NumerIntegration_2017_head(x.handle(), &step, &rule, &result), 0);
    } else {
        EXPECT_EQ(NumerIntegration_head(x.handle(), &step, &rule, &result, &err), 0);
        EXPECT_EQ(err, 0);
    }
    return result;
}

void ExpectClose(double value, Long exact) {
    EXPECT_NEAR(value, static_cast<double>(exact),
                1e-14 * (1 + std::fabs(static_cast<double>(exact))));
}

// Panels with an even number of intervals gain a degree. A remainder integrated by a lower rule
// limits the degree.
TEST(DefiniteIntegrals, AreExactToTheirDegreeAtEveryCount) {
    for (int32_t rule = 0; rule < 4; ++rule)
        for (int32_t n = rule + 2; n < 40; ++n) {
            SCOPED_TRACE("rule " + std::to_string(rule) + ", n " + std::to_string(n));
            const int32_t rest = (n - 1) % (rule + 1);
            const int whole = rule == 0 ? 1 : rule == 3 ? 5 : 3;
            const int ofRest[] = {whole, 1, 3, 3};
            const int startOfOwnOrder = rule == 0   ? 1
                                        : rest == 0 ? whole
                                        : rule == 1 ? 2
                                        : rule == 2 ? 3
                                                    : 4;
            const Long end = (n - 1) * Long{dt};
            const int atEnd = std::min(whole, ofRest[rest]);
            ExpectClose(Definite(Sampled(atEnd, n), rule, false), ItsIntegral(atEnd, end));
            ExpectClose(Definite(Sampled(startOfOwnOrder, n), rule, true),
                        ItsIntegral(startOfOwnOrder, end));
            ExpectClose(Definite(Sampled(atEnd, n), rule, false, -dt), ItsIntegral(atEnd, end));
            // Not exact for a higher degree, so that no other rule is mistaken for this one.
            const Long beyond = ItsIntegral(atEnd + 1, end);
            EXPECT_GT(std::fabs(Definite(Sampled(atEnd + 1, n), rule, false) - beyond),
                      1e-9 * beyond);
        }
}

TEST(DefiniteIntegrals, RectanglesAndSmallCases) {
    EXPECT_EQ(Definite({1, 2, 3}, 0, false, 1.0), 4.0);
    EXPECT_EQ(Definite({1, 2, 3}, 1, false, 1.0), 4.0);
    EXPECT_EQ(Definite({1, 2, 4, 8}, 4, true, 0.5), 3.5);
    EXPECT_EQ(Definite({1, 2, 4, 8}, 5, true, -0.5), 7.0);
    // Five samples with rule 2: a 3/8 panel followed by a trapezoid, or preceded by an end formula.
    EXPECT_NEAR(Definite({1, 0, 0, 0, 0}, 2, false, 1.0), 3.0 / 8, 1e-16);
    EXPECT_NEAR(Definite({0, 0, 0, 0, 1}, 2, false, 1.0), 1.0 / 2, 1e-16);
    EXPECT_NEAR(Definite({1, 0, 0, 0, 0}, 2, true, 1.0), 9.0 / 24, 1e-16);
    EXPECT_NEAR(Definite({0, 0, 0, 0, 1}, 2, true, 1.0), 3.0 / 8, 1e-16);
}

TEST(DefiniteIntegrals, CodesComeInTheirOrder) {
    const double step = 1.0;
    double result;
    ErrorCode err;
    const auto first = [&](int32_t n, int32_t rule) {
        const DBLArray x(n);
        result = 0;
        EXPECT_EQ(NumerIntegration_head(x.handle(), &step, &rule, &result, &err), 0);
        EXPECT_TRUE(std::isnan(result));
        return err;
    };
    const auto revised = [&](int32_t n, int32_t rule) {
        const DBLArray x(n);
        result = 0;
        const ErrorCode code = NumerIntegration_2017_head(x.handle(), &step, &rule, &result);
        EXPECT_TRUE(std::isnan(result));
        return code;
    };
    for (int32_t rule = 0; rule < 4; ++rule) {
        EXPECT_EQ(first(0, rule), ErrEmptyInput);
        EXPECT_EQ(first(rule + 1, rule), ErrSizesDisagree);
        EXPECT_EQ(revised(rule + 1, rule), ErrSizesDisagree);
    }
    EXPECT_EQ(first(1, 4), ErrInvalidSelector);
    EXPECT_EQ(first(9, -1), ErrInvalidSelector);
    EXPECT_EQ(revised(0, 9), ErrEmptyInput);
    EXPECT_EQ(revised(10, 9), ErrSizesDisagree);
    EXPECT_EQ(revised(11, 9), ErrInvalidSelector);
    EXPECT_EQ(revised(9, -1), ErrInvalidSelector);
    EXPECT_EQ(revised(9, 2147483647), ErrSizesDisagree);
    EXPECT_EQ(revised(1, 4), ErrSizesDisagree);
}

// A block of three dimensions in plain memory.
struct Volume {
    Volume(int32_t d0, int32_t d1, int32_t d2, const std::function<double(int32_t)> &value)
        : memory(static_cast<std::size_t>(d0 * d1 * d2) * 8 + 12) {
        const int32_t sizes[3] = {d0, d1, d2};
        std::memcpy(memory.data(), sizes, sizeof sizes);
        for (int32_t i = 0; i < d0 * d1 * d2; ++i) {
            const double element = value(i);
            std::memcpy(memory.data() + 12 + 8 * static_cast<std::size_t>(i), &element, 8);
        }
        block = memory.data();
    }
    DBL3D handle() { return reinterpret_cast<DBL3D>(&block); }
    std::vector<unsigned char> memory;
    void *block;
};

TEST(DefiniteIntegrals, ProductsOverTwoAndThreeDimensions) {
    const DBLArray dts{0.5, -0.25, 2.0};
    const auto square = [](double t) { return 1 + t * t; };
    const auto integral = [](double t) { return t + t * t * t / 3; };
    constexpr int32_t rows = 5;
    constexpr int32_t cols = 7;
    constexpr int32_t planes = 9;
    DBLMatrix x(rows, cols);
    for (int32_t i = 0; i < rows * cols; ++i)
        x.data()[i] = square(i / cols * 0.25) * (i % cols * 0.5);
    const double plane = integral(4 * 0.25) * 4.5;
    double result = 0;
    for (const auto &integrate : {NumerIntegration2D_head, NumerIntegration2D_2017_head}) {
        EXPECT_EQ(integrate(x.handle(), dts.handle(), 1, &result), 0);
        EXPECT_NEAR(result, plane, 1e-14 * plane);
    }
    // The last dimension counts the planes, each of size rows by columns.
    Volume volume(rows, cols, planes, [&](int32_t i) {
        return x[i % (rows * cols)] * square(i / (rows * cols) * 2.0);
    });
    for (const auto &integrate : {NumerIntegration3D_head, NumerIntegration3D_2017_head}) {
        EXPECT_EQ(integrate(volume.handle(), dts.handle(), 1, &result), 0);
        EXPECT_NEAR(result, plane * integral(16.0), 1e-14 * plane * integral(16.0));
    }
    // The revisions differ if samples are left over.
    double elder = 0;
    NumerIntegration3D_head(volume.handle(), dts.handle(), 2, &elder);
    NumerIntegration3D_2017_head(volume.handle(), dts.handle(), 2, &result);
    EXPECT_GT(std::fabs(elder - result), 1e-3 * result);
}

TEST(DefiniteIntegrals, CodesOfTwoAndThreeDimensions) {
    const DBLArray one{1.0};
    const DBLArray two{1.0, 1.0};
    const DBLArray three{1.0, 1.0, 1.0};
    double result;
    const auto planar = [&](int32_t rows, int32_t cols, const DBLArray &dts, uint16_t rule) {
        const DBLMatrix x(rows, cols);
        result = 0;
        const ErrorCode code = NumerIntegration2D_head(x.handle(), dts.handle(), rule, &result);
        EXPECT_EQ(NumerIntegration2D_2017_head(x.handle(), dts.handle(), rule, &result), code);
        EXPECT_TRUE(std::isnan(result));
        return code;
    };
    EXPECT_EQ(planar(2, 9, one, 4), ErrSizesDisagree);
    EXPECT_EQ(planar(9, 2, one, 4), ErrSizesDisagree);
    EXPECT_EQ(planar(9, 9, one, 4), ErrFewerThanTwo);
    EXPECT_EQ(planar(9, 9, two, 4), ErrInvalidSelector);
    EXPECT_EQ(planar(9, 4, two, 3), ErrSizesDisagree);
    EXPECT_EQ(planar(3, 9, two, 2), ErrSizesDisagree);
    const auto spatial = [&](int32_t d0, int32_t d1, int32_t d2, const DBLArray &dts,
                             uint16_t rule) {
        Volume x(d0, d1, d2, [](int32_t) { return 1.0; });
        result = 0;
        const ErrorCode code = NumerIntegration3D_head(x.handle(), dts.handle(), rule, &result);
        EXPECT_EQ(NumerIntegration3D_2017_head(x.handle(), dts.handle(), rule, &result), code);
        EXPECT_TRUE(std::isnan(result));
        return code;
    };
    EXPECT_EQ(spatial(2, 3, 3, two, 4), ErrSizesDisagree);
    EXPECT_EQ(spatial(3, 2, 3, two, 4), ErrSizesDisagree);
    EXPECT_EQ(spatial(3, 3, 2, two, 4), ErrSizesDisagree);
    EXPECT_EQ(spatial(3, 3, 3, two, 4), ErrFewerThanThree);
    EXPECT_EQ(spatial(3, 3, 3, three, 4), ErrInvalidSelector);
    EXPECT_EQ(spatial(5, 5, 4, three, 3), ErrSizesDisagree);
}

// Running integrals.

// For polynomials of its degree, the panel around a sample gives the exact mean over an interval:
// the interval before the sample for the trapezoid and the 3/8 rule, the interval around it for the
// others, whose weights belong to shorter panels. All rules are exact for a constant.
TEST(RunningIntegrals, OfAConstantGrowEvenly) {
    for (int32_t rule = 0; rule < 6; ++rule)
        for (const int32_t n : {1, 2, 3, 7}) {
            DBLArray x(Samples(static_cast<std::size_t>(n), 2.0));
            const DBLArray ends{2.0, 2.0};
            EXPECT_EQ(Integral90(x.handle(), ends.handle(), ends.handle(), 0.5, rule), 0);
            for (int32_t i = 0; i < n; ++i)
                EXPECT_NEAR(x[i], rule < 4 ? i + 1 : i, 1e-14) << rule;
        }
}

// One nonzero sample shows the weights, and the neighbour to which each weight applies.
TEST(RunningIntegrals, TakeTheStatedNeighbours) {
    const Samples weights[] = {{0, 0.5, 0.5, 0, 0},
                               {0, 1.0 / 6, 4.0 / 6, 1.0 / 6, 0},
                               {1.0 / 8, 3.0 / 8, 3.0 / 8, 1.0 / 8, 0},
                               {7.0 / 90, 32.0 / 90, 12.0 / 90, 32.0 / 90, 7.0 / 90}};
    constexpr int32_t n = 5;
    for (int32_t rule = 0; rule < 4; ++rule)
        for (int32_t at = -2; at < n + 2; ++at) {
            Samples all(n + 4, 0.0);
            all[static_cast<std::size_t>(at + 2)] = 3.0;
            DBLArray x(Samples(all.begin() + 2, all.begin() + 2 + n));
            // A single value before the data is x[-1].
            const DBLArray initial(rule < 2 ? Samples{all[1]} : Samples{all[0], all[1]});
            const DBLArray final{all[n + 2], all[n + 3]};
            EXPECT_EQ(Integral90(x.handle(), initial.handle(), final.handle(), 0.5, rule), 0);
            double sum = 0.0;
            for (int32_t i = 0; i < n; ++i) {
                const int32_t offset = at - i + 2;
                const bool isMet = offset >= 0 && offset < 5 && (rule >= 2 || at >= -1);
                sum += isMet ? 1.5 * weights[rule][static_cast<std::size_t>(offset)] : 0.0;
                EXPECT_NEAR(x[i], sum, 1e-15) << rule << " " << at << " " << i;
            }
        }
    DBLArray single{4.0};
    const double initial = 1.0;
    const double final = 7.0;
    const double step = 0.5;
    ErrorCode err = 1;
    EXPECT_EQ(Integral(single.handle(), &initial, &final, &step, &err), 0);
    EXPECT_EQ(err, 0);
    EXPECT_NEAR(single[0], (1 + 16 + 7) * 0.5 / 6, 1e-15);
}

TEST(RunningIntegrals, FromZeroAreExactToTheirDegreeAtEveryPlace) {
    for (int32_t rule = 0; rule < 4; ++rule)
        for (int32_t n = rule + 2; n < 20; ++n) {
            const int degree = rule == 0 ? 1 : rule == 1 ? 2 : rule == 2 ? 3 : 4;
            DBLArray x(Sampled(degree, n));
            EXPECT_EQ(Integral_2017(x.handle(), dt, rule), 0);
            for (int32_t i = 0; i < n; ++i)
                ExpectClose(x[i], ItsIntegral(degree, i * Long{dt}));
        }
    for (const auto &[rule, expected] :
         {std::pair{4, Samples{0, 0.5, 1.5}}, {5, Samples{0, 1, 3}}}) {
        DBLArray x{1.0, 2.0, 4.0};
        EXPECT_EQ(Integral_2017(x.handle(), 0.5, rule), 0);
        EXPECT_EQ(x.values(), expected);
        DBLArray other{1.0, 2.0, 4.0};
        const DBLArray none(0);
        EXPECT_EQ(Integral90(other.handle(), none.handle(), none.handle(), 0.5, rule), 0);
        EXPECT_EQ(other.values(), expected);
    }
}

TEST(RunningIntegrals, CodesComeInTheirOrder) {
    const double end = 1.0;
    const auto elder = [&](int32_t n, double step) {
        DBLArray x(n);
        ErrorCode err = 1;
        EXPECT_EQ(Integral(x.handle(), &end, &end, &step, &err), 0);
        EXPECT_EQ(x.size(), err == 0 ? n : 0);
        return err;
    };
    EXPECT_EQ(elder(0, 0.0), ErrEmptyInput) << "the last check decides";
    EXPECT_EQ(elder(3, -1.0), ErrSamplingNotPositive);
    EXPECT_EQ(elder(3, nan), 0);
    const auto byRule = [](int32_t n, int32_t initial, int32_t final, double step, int32_t rule) {
        DBLArray x(n);
        const DBLArray before(initial);
        const DBLArray behind(final);
        const ErrorCode code = Integral90(x.handle(), before.handle(), behind.handle(), step, rule);
        EXPECT_EQ(x.size(), code == 0 ? n : 0);
        return code;
    };
    EXPECT_EQ(byRule(0, 0, 0, 0.0, 9), ErrSamplingNotPositive);
    EXPECT_EQ(byRule(0, 0, 0, 1.0, 9), ErrEmptyInput);
    EXPECT_EQ(byRule(3, 2, 2, 1.0, 6), ErrInvalidSelector);
    EXPECT_EQ(byRule(3, 2, 2, 1.0, -1), ErrInvalidSelector);
    EXPECT_EQ(byRule(3, 0, 2, 1.0, 0), ErrEmptyInput);
    EXPECT_EQ(byRule(3, 1, 0, 1.0, 0), 0);
    EXPECT_EQ(byRule(3, 0, 1, 1.0, 1), ErrEmptyInput);
    EXPECT_EQ(byRule(3, 1, 0, 1.0, 1), ErrEmptyInput);
    EXPECT_EQ(byRule(3, 1, 0, 1.0, 2), ErrEmptyInput);
    EXPECT_EQ(byRule(3, 1, 1, 1.0, 2), ErrFewerThanTwo);
    EXPECT_EQ(byRule(3, 2, 1, nan, 2), 0);
    EXPECT_EQ(byRule(3, 2, 1, 1.0, 3), ErrFewerThanTwo);
    EXPECT_EQ(byRule(3, 1, 2, 1.0, 3), ErrFewerThanTwo);
    EXPECT_EQ(byRule(3, 0, 0, 1.0, 5), 0);
    const auto fromZero = [](int32_t n, double step, int32_t rule) {
        DBLArray x(n);
        const ErrorCode code = Integral_2017(x.handle(), step, rule);
        EXPECT_EQ(x.size(), code == 0 ? n : 0);
        return code;
    };
    EXPECT_EQ(fromZero(0, 0.0, 9), ErrSamplingNotPositive);
    EXPECT_EQ(fromZero(0, 1.0, 9), ErrEmptyInput);
    EXPECT_EQ(fromZero(4, 1.0, 3), ErrSizesDisagree);
    EXPECT_EQ(fromZero(4, 1.0, 9), ErrSizesDisagree);
    EXPECT_EQ(fromZero(4, 1.0, 2147483647), ErrSizesDisagree);
    EXPECT_EQ(fromZero(11, 1.0, 9), ErrInvalidSelector);
    EXPECT_EQ(fromZero(4, 1.0, -1), ErrInvalidSelector);
    EXPECT_EQ(fromZero(1, 1.0, 4), ErrSizesDisagree);
}

// Derivatives.

// Each rule is exact for the polynomials of its order, at every place and count, and its error
// for the sine falls with that power of the step.
TEST(Derivatives, HaveTheirOrder) {
    const int orders[] = {2, 4, 1, 1};
    for (int32_t rule = 0; rule < 4; ++rule)
        for (const int32_t n : {1, 2, 3, 4, 20}) {
            const int degree = orders[rule];
            const Samples all = Sampled(degree, n + 4, -2);
            DBLArray x(Samples(all.begin() + 2, all.begin() + 2 + n));
            const DBLArray initial(rule == 1 ? Samples{all[0], all[1]} : Samples{all[1]});
            const DBLArray final(Samples(all.end() - 2, all.end()));
            EXPECT_EQ(Derivative85(x.handle(), initial.handle(), final.handle(), &dt, rule), 0);
            for (int32_t i = 0; i < n; ++i) {
                Long slope = 0;
                for (int k = 1; k <= degree; ++k)
                    slope += k * std::pow(i * Long{dt}, Long(k - 1));
                EXPECT_NEAR(x[i], static_cast<double>(slope), 2e-13 * (1 + std::fabs(x[i])))
                    << rule;
            }
        }
    for (int32_t rule = 0; rule < 4; ++rule) {
        const auto error = [=](double h) {
            DBLArray x{std::sin(1.0)};
            const DBLArray initial(rule == 1 ? Samples{std::sin(1 - 2 * h), std::sin(1 - h)}
                                             : Samples{std::sin(1 - h)});
            const DBLArray final{std::sin(1 + h), std::sin(1 + 2 * h)};
            Derivative85(x.handle(), initial.handle(), final.handle(), &h, rule);
            return std::fabs(x[0] - std::cos(1.0));
        };
        EXPECT_NEAR(std::log2(error(0.02) / error(0.01)), orders[rule], 0.02) << rule;
    }
    DBLArray x{5.0};
    const double initial = 1.0;
    const double final = 4.0;
    ErrorCode err = 1;
    EXPECT_EQ(Derivative(x.handle(), &initial, &final, &dt, &err), 0);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(x[0], 6.0);
}

// The values that a rule needs on either side, and longer arrays that begin with these.
TEST(RunningForms, TakeTheFirstOfLongerEnds) {
    struct Needs {
        int32_t initial, final;
    };
    const auto expectSame = [](const Needs &needs, int32_t rule, const auto &compute) {
        const Samples ends = {2.0, 3.0, 5.0};
        const DBLArray longer(ends);
        const DBLArray initial(Samples(ends.begin(), ends.begin() + needs.initial));
        const DBLArray final(Samples(ends.begin(), ends.begin() + needs.final));
        const DBLArray x{7.0, 11.0, 17.0}, y{7.0, 11.0, 17.0};
        EXPECT_EQ(compute(x.handle(), longer.handle(), longer.handle(), rule), 0);
        EXPECT_EQ(compute(y.handle(), initial.handle(), final.handle(), rule), 0);
        EXPECT_EQ(x.values(), y.values()) << rule;
    };
    const Needs ofIntegral[] = {{1, 0}, {1, 1}, {2, 1}, {2, 2}};
    const Needs ofDerivative[] = {{1, 1}, {2, 2}, {0, 1}, {1, 0}};
    for (int32_t rule = 0; rule < 4; ++rule) {
        expectSame(ofIntegral[rule], rule, [](DBL1D x, DBL1D initial, DBL1D final, int32_t r) {
            return Integral90(x, initial, final, dt, r);
        });
        expectSame(ofDerivative[rule], rule, [](DBL1D x, DBL1D initial, DBL1D final, int32_t r) {
            return Derivative85(x, initial, final, &dt, r);
        });
    }
}

TEST(Derivatives, CodesComeInTheirOrder) {
    const double end = 1.0;
    const auto elder = [&](int32_t n, double step) {
        DBLArray x(n);
        ErrorCode err = 1;
        EXPECT_EQ(Derivative(x.handle(), &end, &end, &step, &err), 0);
        EXPECT_EQ(x.size(), err == 0 ? n : 0);
        return err;
    };
    EXPECT_EQ(elder(0, 1.0), ErrEmptyInput);
    EXPECT_EQ(elder(0, 0.0), ErrSamplingNotPositive) << "the last check decides";
    EXPECT_EQ(elder(3, nan), ErrSamplingNotPositive);
    const auto byRule = [](int32_t n, int32_t initial, int32_t final, double step, int32_t rule) {
        DBLArray x(n);
        const DBLArray before(initial);
        const DBLArray behind(final);
        const ErrorCode code =
            Derivative85(x.handle(), before.handle(), behind.handle(), &step, rule);
        EXPECT_EQ(x.size(), code == 0 ? n : 0);
        return code;
    };
    EXPECT_EQ(byRule(0, 0, 0, 0.0, 9), ErrEmptyInput);
    EXPECT_EQ(byRule(3, 0, 0, 0.0, 9), ErrSamplingNotPositive);
    EXPECT_EQ(byRule(3, 2, 2, 1.0, 4), ErrInvalidSelector);
    EXPECT_EQ(byRule(3, 2, 2, 1.0, -1), ErrInvalidSelector);
    EXPECT_EQ(byRule(3, 0, 1, 1.0, 0), ErrEmptyInput);
    EXPECT_EQ(byRule(3, 1, 0, 1.0, 0), ErrEmptyInput);
    EXPECT_EQ(byRule(3, 1, 2, 1.0, 1), ErrFewerThanTwo);
    EXPECT_EQ(byRule(3, 2, 1, 1.0, 1), ErrFewerThanTwo);
    EXPECT_EQ(byRule(3, 0, 0, 1.0, 1), ErrFewerThanTwo);
    EXPECT_EQ(byRule(3, 2, 0, 1.0, 2), ErrEmptyInput);
    EXPECT_EQ(byRule(3, 0, 1, nan, 2), 0);
    EXPECT_EQ(byRule(3, 0, 2, 1.0, 3), ErrEmptyInput);
    EXPECT_EQ(byRule(3, 1, 0, 1.0, 3), 0);
}

} // namespace
} // namespace qx::test
