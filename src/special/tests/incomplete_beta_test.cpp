#include "special/incomplete_beta.h"
#include "special/logarithms.h"

#include "tests/support/table.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>

namespace qx::test {
namespace {

constexpr double eps = 0x1p-52;

UnitPoint Share(double p, double q) { return UnitPoint::Share({p, 0.0}, {q, 0.0}); }

TEST(IncompleteBeta, AgreesWithMultiplePrecisionInBothTails) {
    int count = 0;
    for (const auto &row : ReadTable(TestData("incomplete_beta.dat"))) {
        const auto &a = row.arguments;
        if (row.name == "lower" || row.name == "upper") {
            const BothTails tails = qx::IncompleteBeta(a[0], a[1], Share(a[2], a[3]));
            const double got = row.name == "lower" ? tails.lower : tails.upper;
            EXPECT_NEAR(got / row.value, 1.0, 90 * eps) << row.text;
            ++count;
        } else {
            const qx::Extended log = qx::LogOf({a[0], 0.0});
            if (row.name == "loghigh")
                EXPECT_EQ(log.high, row.value) << row.text;
            else
                EXPECT_NEAR(log.low, row.value, 0x1p-90 * std::fabs(log.high) + 0x1p-95)
                    << row.text;
        }
    }
    EXPECT_GT(count, 200);
}

TEST(IncompleteBeta, EndsAreExact) {
    EXPECT_EQ(qx::IncompleteBeta(2.5, 0.5, Share(0.0, 1.0)).lower, 0.0);
    EXPECT_EQ(qx::IncompleteBeta(2.5, 0.5, Share(1.0, 0.0)).upper, 0.0);
    EXPECT_EQ(qx::IncompleteBeta(1.0, 1.0, Share(1.0, 3.0)).lower, 0.25);
}

// In each tail, down to the smallest probability; the bound allows for the error of the argument.
TEST(IncompleteBeta, InverseReturnsToTheTail) {
    for (const double a : {0.5, 1.0, 2.5, 10.5, 100.0, 1e4, 5e5})
        for (const double b : {0.5, 1.0, 5.0, 30.0, 1e3, 1e6})
            for (const double tail : {0.05, 0.5, 0.999, 1e-10, 1e-100, 1e-250})
                for (const bool isUpper : {false, true}) {
                    const UnitPoint point = qx::InverseIncompleteBeta(a, b, tail, isUpper);
                    const double smaller = std::fmin(point.x.high, point.y.high);
                    if (smaller == 0.0)
                        continue; // beyond the range
                    const BothTails tails = qx::IncompleteBeta(a, b, point);
                    const double got = isUpper ? tails.upper : tails.lower;
                    const double slope = qx::BetaPower(a, b, point) / (1.0 - smaller);
                    EXPECT_LE(std::fabs(got - tail), 20 * eps * std::fmax(tail, slope))
                        << a << ' ' << b << ' ' << tail << ' ' << isUpper;
                }
}

} // namespace
} // namespace qx::test
