#include "qx/distributions.h"
#include "qx/errors.h"
#include "tests/support/table.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <limits>
#include <numbers>
#include <string>
#include <vector>

namespace qx::test {
namespace {

constexpr double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

struct Outcome {
    double value;
    ErrorCode err;
};

// Calls the revision for any distribution: `parameters` are the degrees of freedom, `choice`
// selects the value or the tail.
double Revised(const std::string &name, const std::vector<double> &arguments, int32_t choice,
               ErrorCode code = 0) {
    Outcome outcome = {7, 7};
    const double *a = arguments.data();
    DBL *value = &outcome.value;
    ErrorCode *err = &outcome.err;
    const auto call = [&]() {
        return name == "norm"    ? NormDist2026_head(a, &choice, value, err)
               : name == "t"     ? TDist2026_head(a, a + 1, &choice, value, err)
               : name == "f"     ? FDist2026_head(a, a + 1, a + 2, &choice, value, err)
               : name == "chi2"  ? ChiSquare2026_head(a, a + 1, &choice, value, err)
               : name == "inorm" ? InvNdist2026_head(a, &choice, value, err)
               : name == "it"    ? InvTdist2026_head(a, &choice, a + 1, value, err)
               : name == "if"    ? InvFDist2026_head(a, &choice, a + 1, a + 2, value, err)
                                 : InvChiSquare2026_head(a, &choice, a + 1, value, err);
    };
    EXPECT_EQ(call(), 0);
    EXPECT_EQ(outcome.err, code) << name;
    EXPECT_EQ(code != 0, std::bit_cast<uint64_t>(outcome.value) == 0x7FF8000000000000U);
    return outcome.value;
}

typedef int32_t (*OneDof)(const DBL *, const int32_t *, DBL *, ErrorCode *);
typedef int32_t (*TwoDofs)(const DBL *, const int32_t *, const int32_t *, DBL *, ErrorCode *);

Outcome Call(OneDof function, double x, int32_t dof) {
    Outcome outcome = {7, 7};
    EXPECT_EQ(function(&x, &dof, &outcome.value, &outcome.err), 0);
    return outcome;
}
Outcome Call(TwoDofs function, double x, int32_t n, int32_t d) {
    Outcome outcome = {7, 7};
    EXPECT_EQ(function(&x, &n, &d, &outcome.value, &outcome.err), 0);
    return outcome;
}
Outcome NormalQuantile(double p) {
    Outcome outcome = {7, 7};
    EXPECT_EQ(InvNdist_head(&p, &outcome.value, &outcome.err), 0);
    return outcome;
}
double Normal(double x) {
    double p = 7;
    EXPECT_EQ(NormDist_head(&x, &p), 0);
    return p;
}

void ExpectCode(const Outcome &outcome, ErrorCode code) {
    EXPECT_EQ(outcome.err, code);
    EXPECT_EQ(std::bit_cast<uint64_t>(outcome.value), 0x7FF8000000000000U);
}

TEST(Distributions, AgreeWithMultiplePrecision) {
    const auto rows = ReadTable(TestData("distributions.dat"));
    ASSERT_GT(rows.size(), 200U);
    for (const auto &row : rows) {
        const auto &a = row.arguments;
        const auto dof = [&](std::size_t i) { return static_cast<int32_t>(a[i]); };
        if (row.name == "normal") {
            EXPECT_NEAR(Normal(a[0]), row.value, 1.2e-5) << row.text;
            continue;
        }
        const Outcome outcome = row.name == "t"   ? Call(TDist_head, a[0], dof(1))
                                : row.name == "f" ? Call(FDist_head, a[0], dof(1), dof(2))
                                                  : Call(ChiSquare_head, a[0], dof(1));
        EXPECT_EQ(outcome.err, 0);
        const double bound = row.name == "t" ? 1e-14 : row.name == "f" ? 7e-14 : 3.2e-15;
        EXPECT_NEAR(outcome.value, row.value, bound) << row.text;
    }
}

TEST(Distributions, InversesLieWithinTheirToleranceBelow) {
    for (const double p : {0.001, 0.1, 0.5, 0.9, 0.999})
        for (const int32_t dof : {2, 5, 40}) {
            // The answer is the lower end of a bracket: p is reached within 1e-4 above it.
            const double t = Call(InvTdist_head, p, dof).value;
            EXPECT_LT(Call(TDist_head, t, dof).value, p);
            EXPECT_GE(Call(TDist_head, t + 1e-4, dof).value, p);
            const double f = Call(InvFDist_head, p, dof, 9).value;
            EXPECT_LT(Call(FDist_head, f, dof, 9).value, p);
            EXPECT_GE(Call(FDist_head, f + 1e-4, dof, 9).value, p);
            const double x = Call(InvChiSquare_head, p, dof).value;
            EXPECT_LT(Call(ChiSquare_head, x, dof).value, p);
            EXPECT_GE(Call(ChiSquare_head, x + 1e-4, dof).value, p);
        }
    EXPECT_NEAR(Call(InvChiSquare_head, 0.5, 20000).value, 19999.33, 0.01) << "a raised bracket";
    EXPECT_NEAR(Call(InvTdist_head, 0.5, 3).value, 0.0, 1e-4);
    EXPECT_NE(Call(InvTdist_head, 0.5, 3).value, 0.0);
    EXPECT_NEAR(Call(InvFDist_head, 0.9999999, 1, 1).value, 10000.0, 1e-3) << "saturates";

    // Abramowitz and Stegun state an error of 4.5e-4 for this approximation.
    for (const auto &[p, x] : {std::pair{0.975, 1.959963985},
                               {0.025, -1.959963985},
                               {0.001, -3.090232306},
                               {0.5, 0.0},
                               {0.9, 1.281551566}})
        EXPECT_NEAR(NormalQuantile(p).value, x, 4.5e-4) << p;
    EXPECT_NE(NormalQuantile(0.5).value, 0.0);
}

// The results of a bisection are on a grid that its bracket and its tolerance determine.
TEST(Distributions, InversesKeepTheirBrackets) {
    const auto expectOnGrid = [](double value, double lo, double hi, int halvings) {
        const double steps = (value - lo) / (hi - lo) * std::exp2(halvings);
        EXPECT_NEAR(steps, std::round(steps), 1e-6) << value;
    };
    for (const double p : {0.01, 0.3, 0.77}) {
        expectOnGrid(Call(InvTdist_head, p, 4).value, -10000.0, 10000.0, 28);
        expectOnGrid(Call(InvFDist_head, p, 4, 7).value, 1e-06, 10000.0, 27);
        expectOnGrid(Call(InvChiSquare_head, p, 4).value, 0.0, 5000.0, 26);
        expectOnGrid(Call(InvChiSquare_head, p, 7000).value, 0.0, 10000.0, 27);
    }
}

TEST(Distributions, EdgesAndCodes) {
    for (const int32_t dof : {1, 2, 1000000})
        EXPECT_EQ(Call(TDist_head, 0.0, dof).value, 0.5);
    for (const double x : {0.3, 1.7, 6.0})
        EXPECT_EQ(Normal(x), 1.0 - Normal(-x));
    EXPECT_TRUE(std::isnan(Normal(nan)));
    EXPECT_EQ(Call(FDist_head, 0.0, 3, 3).value, 0.0);
    EXPECT_EQ(Call(FDist_head, -inf, 3, 3).value, 0.0);
    EXPECT_EQ(Call(ChiSquare_head, 0.0, 3).value, 0.0);
    EXPECT_EQ(Call(ChiSquare_head, -1.0, 0).value, 0.0);
    const Outcome noFreedom = Call(ChiSquare_head, 1.0, 0);
    EXPECT_TRUE(std::isnan(noFreedom.value));
    EXPECT_EQ(noFreedom.err, 0);
    const Outcome notRefused = Call(ChiSquare_head, nan, 3);
    EXPECT_TRUE(std::isnan(notRefused.value));
    EXPECT_EQ(notRefused.err, 0);

    ExpectCode(Call(TDist_head, nan, 0), ErrTooFewForParameters);
    ExpectCode(Call(TDist_head, nan, 1), ErrNaNInData);
    ExpectCode(Call(FDist_head, 1.0, 0, 1), ErrTooFewForParameters);
    ExpectCode(Call(FDist_head, 1.0, 1, 0), ErrTooFewForParameters);
    ExpectCode(Call(FDist_head, nan, 1, 1), ErrNaNInData);
    ExpectCode(Call(ChiSquare_head, 1.0, -1), ErrTooFewForParameters);
    ExpectCode(Call(InvTdist_head, 2.0, 0), ErrTooFewForParameters);
    ExpectCode(Call(InvTdist_head, 2.0, 1), ErrProbabilityOutOfRange);
    ExpectCode(Call(InvFDist_head, -0.1, 1, 0), ErrTooFewForParameters);
    ExpectCode(Call(InvFDist_head, -0.1, 1, 1), ErrProbabilityOutOfRange);
    ExpectCode(Call(InvChiSquare_head, 2.0, 0), ErrProbabilityOutOfRange);
    ExpectCode(Call(InvChiSquare_head, 1.0, 0), ErrTooFewForParameters);
    ExpectCode(NormalQuantile(1.5), ErrProbabilityOutOfRange);

    EXPECT_EQ(Call(InvTdist_head, 0.0, 1).value, -inf);
    EXPECT_EQ(Call(InvTdist_head, 1.0, 1).value, inf);
    EXPECT_EQ(Call(InvFDist_head, 0.0, 1, 1).value, 0.0);
    EXPECT_EQ(Call(InvFDist_head, 1.0, 1, 1).value, inf);
    EXPECT_EQ(Call(InvChiSquare_head, 0.0, 1).value, 0.0);
    EXPECT_EQ(Call(InvChiSquare_head, 1.0, 1).value, inf);
    EXPECT_EQ(NormalQuantile(0.0).value, -inf);
    EXPECT_EQ(NormalQuantile(1.0).value, inf);
    // A NaN is not refused as a probability outside the range, and the bisections return their
    // lower ends.
    EXPECT_TRUE(std::isnan(NormalQuantile(nan).value));
    const auto expectLowerEnd = [](const Outcome &outcome, double lower) {
        EXPECT_EQ(outcome.err, 0);
        EXPECT_EQ(outcome.value, lower);
    };
    expectLowerEnd(Call(InvTdist_head, nan, 3), -10000.0);
    expectLowerEnd(Call(InvFDist_head, nan, 3, 4), 1e-6);
    expectLowerEnd(Call(InvChiSquare_head, nan, 3), 0.0);
}

constexpr double eps = std::numeric_limits<double>::epsilon();

struct TailRow {
    std::string distribution, what;
    std::vector<double> arguments;
    double value;
    std::string text;
};

std::vector<TailRow> TailRows() {
    std::vector<TailRow> rows;
    for (const auto &row : ReadTable(TestData("distribution_tails.dat"))) {
        const auto cut = row.name.find('_');
        rows.push_back({row.name.substr(0, cut), row.name.substr(cut + 1), row.arguments, row.value,
                        row.text});
    }
    return rows;
}

TEST(DistributionTails, AgreeWithMultiplePrecision) {
    const auto rows = TailRows();
    ASSERT_GT(rows.size(), 700U);
    const std::vector<std::string> kinds = {"cdf", "sf", "logcdf", "logsf", "pdf"};
    for (const auto &row : rows)
        for (int32_t what = 0; what < 5; ++what)
            if (row.what == kinds[static_cast<std::size_t>(what)]) {
                EXPECT_NEAR(Revised(row.distribution, row.arguments, what), row.value,
                            4 * eps * std::fabs(row.value) + 2 * 0x1p-1074)
                    << row.text;
            }
}

// From the tail probability back to the argument, where the rounding of the probability is not
// amplified.
TEST(DistributionTails, InversesReturnTheArgument) {
    int checked = 0;
    for (const auto &row : TailRows()) {
        const bool isUpper = row.what == "sf";
        const double x = row.arguments[0];
        if ((row.what != "cdf" && !isUpper) || row.value > 0.5 || row.value < 1e-300 || x == 0)
            continue;
        const double slope = std::fabs(x) * Revised(row.distribution, row.arguments, 4);
        std::vector<double> arguments = row.arguments;
        arguments[0] = row.value;
        const double back = Revised("i" + row.distribution, arguments, isUpper);
        EXPECT_NEAR(back, x, (4 + row.value / slope) * eps * std::fabs(x)) << row.text;
        ++checked;
    }
    EXPECT_GT(checked, 90);
}

// Degrees 1 and 2 have closed forms without cancellation; on both sides of the threshold between
// the methods.
TEST(DistributionTails, StudentAgreesWithClosedForms) {
    for (double t = 1e-3; t < 1e7; t *= 1.05) {
        const double root = std::sqrt(2 + t * t);
        const double cauchy = std::atan(1 / t) / std::numbers::pi, second = 1 / (root * (root + t));
        EXPECT_NEAR(Revised("t", {t, 1}, 1), cauchy, 5 * eps * cauchy) << t;
        EXPECT_NEAR(Revised("t", {t, 2}, 1), second, 6 * eps * second) << t;
        const double rounding = cauchy * std::numbers::pi * (1 + t * t) / t; // of the probability
        EXPECT_NEAR(Revised("it", {cauchy, 1}, 1) / t, 1, (4 + 4 * rounding) * eps) << t;
        EXPECT_NEAR(Revised("t", {t, 2}, 4), 1 / (root * root * root),
                    6 * eps / (root * root * root));
    }
    for (const double n : {1.0, 5.5, 50.0, 1e4, 1e6, 1e9}) {
        const double below = Revised("t", {0.9, n}, 1);
        const double above = Revised("t", {std::nextafter(0.9, 1), n}, 1);
        EXPECT_NEAR(below, above, 5 * eps * below) << n;
    }
}

// On both sides of the ends of the normal quantile's regions, compared with mpmath at 50 digits.
TEST(DistributionTails, NormalQuantileAgreesWithReferences) {
    const double rows[][2] = {
        // p, the point above which it lies
        {1e-300, 37.047096299361199237},  {1e-100, 21.273453560965324294},
        {1e-20, 9.2623400897984075796},   {1.3e-11, 6.6676114565107408347},
        {1.4e-11, 6.6567230915181836356}, {0.0001, 3.7190164854556805523},
        {0.0749, 1.4402382675279636631},  {0.0751, 1.4388253927525399824},
        {0.2, 0.84162123357291416552},    {0.4999, 0.00025066283008800749239},
    };
    for (const auto &[p, x] : rows) {
        EXPECT_NEAR(Revised("inorm", {p}, 1) / x, 1, 4 * eps) << p;
        EXPECT_EQ(Revised("inorm", {p}, 0), -Revised("inorm", {p}, 1)) << p;
    }
    EXPECT_EQ(Revised("inorm", {0.5}, 0), 0);
}

TEST(DistributionTails, ReachLimitsOfTheDegrees) {
    for (const double t : {-30.0, -1.0, 0.25, 8.0})
        for (const int32_t what : {0, 1, 2, 3, 4}) {
            const double limit = Revised("norm", {t}, what);
            EXPECT_NEAR(Revised("t", {t, inf}, what), limit, 4 * eps * std::fabs(limit));
        }
    for (const double x : {0.5, 3.0, 40.0}) {
        const double limit = Revised("chi2", {x, 3.5}, 1);
        EXPECT_NEAR(Revised("f", {x / 3.5, 3.5, inf}, 1), limit, 60 * eps * limit)
            << "x / 3.5 is rounded";
    }
    // The Cauchy distribution far out: 1 / (pi t), also where it underflows.
    EXPECT_NEAR(Revised("t", {1e200, 1.0}, 1), 1e-200 / std::numbers::pi, 4e-200 * eps);
    EXPECT_NEAR(Revised("it", {1e-200, 1.0}, 1), 1e200 / std::numbers::pi, 4e200 * eps);
    EXPECT_EQ(Revised("it", {1e-300, 0.5}, 1), inf);
    EXPECT_EQ(Revised("ichi2", {1e-300, 0.01}, 0), 0);
    // Few degrees of freedom, one or both, of the F distribution, compared with 700 digits
    // (mpmath).
    const double few[][5] = {{1e-200, 1e-305, 1e-305, 0.5, 0.5},
                             {1e-200, 1e-305, 3.0, 1.0, 5.8164518930589053322e-303},
                             {2.5, 1e-100, 7.0, 1.0, 1.1480387820551947758e-98},
                             {1e-5, 3.0, 1e-60, 6.3563543382230254642e-59, 1.0},
                             {2.5, 1e-22, 1e-26, 9.9990000999900008999e-5, 0.9999000099990001}};
    for (const auto &row : few)
        for (const int32_t upper : {0, 1})
            EXPECT_NEAR(Revised("f", {row[0], row[1], row[2]}, upper) / row[3 + upper], 1.0, 2e-15)
                << row[1] << " " << row[2];
    // With almost no degrees of freedom, nearly all the probability lies beyond the range of
    // doubles.
    for (const double degrees : {1e-20, 1e-50, 1.5272285085778469e-158}) {
        EXPECT_EQ(Revised("t", {1e300, degrees}, 1), 0.5);
        EXPECT_EQ(Revised("it", {0.43, degrees}, 1), inf);
        EXPECT_EQ(Revised("it", {0.43, degrees}, 0), -inf);
    }
    EXPECT_EQ(Revised("chi2", {5e-324, 5e-324}, 0), 1);
    EXPECT_EQ(Revised("ichi2", {0.5, 5e-324}, 0), 0);
    // A large number of degrees of freedom at the mean of the distribution.
    EXPECT_NEAR(Revised("chi2", {1e10, 1e10}, 0),
                0.5 + 1 / (3 * std::sqrt(std::numbers::pi * 1e10)), 1e-14);
}

TEST(DistributionTails, EdgesAndCodes) {
    for (const std::string name : {"norm", "t", "f", "chi2"}) {
        std::vector<double> a = {inf, 3.0, 5.0};
        EXPECT_EQ(Revised(name, a, 0), 1);
        EXPECT_EQ(Revised(name, a, 1), 0);
        EXPECT_EQ(Revised(name, a, 2), 0);
        EXPECT_EQ(Revised(name, a, 3), -inf);
        EXPECT_EQ(Revised(name, a, 4), 0);
        a[0] = -inf;
        EXPECT_EQ(Revised(name, a, 0), 0);
        EXPECT_EQ(Revised(name, a, 1), 1);
        a[0] = nan;
        Revised(name, a, 4, ErrNaNInData);
        Revised(name, a, 5, ErrInvalidSelector);
        Revised(name, a, -1, ErrInvalidSelector);
        a = {0.25, 3.0, 5.0};
        const std::string inverse = "i" + name;
        Revised(inverse, a, 2, ErrInvalidSelector);
        for (const double p : {-0.1, 1.1, nan})
            Revised(inverse, {p, 3.0, 5.0}, 1, ErrProbabilityOutOfRange);
        EXPECT_EQ(Revised(inverse, {1.0, 3.0, 5.0}, 0), inf);
        EXPECT_EQ(Revised(inverse, {0.0, 3.0, 5.0}, 1), inf);
        EXPECT_EQ(Revised(inverse, {1.0, 3.0, 5.0}, 1), Revised(inverse, {0.0, 3.0, 5.0}, 0));
        if (name == "norm")
            continue;
        for (const double degrees : {0.0, -1.0, nan}) {
            Revised(name, {nan, degrees, 5.0}, 0, ErrTooFewForParameters);
            Revised(inverse, {2.0, degrees, 5.0}, 0, ErrTooFewForParameters);
        }
    }
    Revised("f", {1.0, 5.0, 0.0}, 0, ErrTooFewForParameters);
    EXPECT_EQ(Revised("inorm", {0.5}, 0), 0);
    EXPECT_EQ(Revised("it", {0.5, 3.0}, 1), 0);
    EXPECT_EQ(Revised("chi2", {0.0, 1.0}, 4), inf);
    EXPECT_EQ(Revised("chi2", {0.0, 2.0}, 4), 0.5);
    EXPECT_EQ(Revised("f", {0.0, 2.0, 3.0}, 4), 1);
    EXPECT_EQ(Revised("f", {0.0, 3.0, 3.0}, 4), 0);
}

} // namespace
} // namespace qx::test
