#include "qx/distributions.h"
#include "qx/errors.h"
#include "tests/support/table.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <limits>

namespace {

constexpr double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

struct Outcome {
    double value;
    ErrorCode err;
};

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
    const auto rows = qx::test::ReadTable(qx::test::TestData("distributions.dat"));
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
            // The bracket that ends at the answer: p is reached within 1e-4 above it.
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

    // Abramowitz and Stegun promise 4.5e-4 for this approximation.
    for (const auto &[p, x] : {std::pair{0.975, 1.959963985},
                               {0.025, -1.959963985},
                               {0.001, -3.090232306},
                               {0.5, 0.0},
                               {0.9, 1.281551566}})
        EXPECT_NEAR(NormalQuantile(p).value, x, 4.5e-4) << p;
    EXPECT_NE(NormalQuantile(0.5).value, 0.0);
}

// The answers of a bisection stand on a grid that its bracket and its tolerance set.
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
    // A NaN is no probability outside the range, and the bisections end at their lower ends.
    EXPECT_TRUE(std::isnan(NormalQuantile(nan).value));
    const auto expectLowerEnd = [](const Outcome &outcome, double lower) {
        EXPECT_EQ(outcome.err, 0);
        EXPECT_EQ(outcome.value, lower);
    };
    expectLowerEnd(Call(InvTdist_head, nan, 3), -10000.0);
    expectLowerEnd(Call(InvFDist_head, nan, 3, 4), 1e-6);
    expectLowerEnd(Call(InvChiSquare_head, nan, 3), 0.0);
}

} // namespace
