#include "special/gamma.h"

#include "tests/support/table.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cmath>
#include <functional>
#include <limits>
#include <map>
#include <random>

namespace qx::test {
namespace {

constexpr double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

TEST(GammaFamily, AgreesWithMultiplePrecision) {
    typedef std::vector<double> Arguments;
    // The bound is relative to the value and allows for the errors of the method: the exponential
    // of a large logarithm in the incomplete functions, and the power in Stirling's formula.
    struct Function {
        std::function<double(const Arguments &)> value;
        std::function<double(const Arguments &, double)> bound;
    };
    const auto incomplete = [](const Arguments &a, double value) {
        // The leading factor is exp(a ln x - x - ln Gamma(a)). Near the middle one function is 1
        // minus the other, hence the absolute term.
        return 4e-16 * (20 + a[0] * (2 + std::fabs(std::log(a[1])))) * std::fabs(value) + 1e-15;
    };
    const std::map<std::string, Function> functions{
        {"gamma",
         {[](const Arguments &a) { return qx::GammaFunction(a[0]); },
          [](const Arguments &, double v) { return 2.7e-15 * std::fabs(v); }}},
        {"lngamma",
         {[](const Arguments &a) { return qx::LnGammaFunction(a[0]); },
          // The bound is absolute near the zeros at 1 and 2.
          [](const Arguments &, double v) { return 2e-15 * (std::fabs(v) + 1); }}},
        {"gammap",
         {[](const Arguments &a) { return qx::IncompleteGammaP(a[0], a[1]); }, incomplete}},
        {"gammaq",
         {[](const Arguments &a) { return qx::IncompleteGammaQ(a[0], a[1]); }, incomplete}},
        {"beta",
         {[](const Arguments &a) { return qx::IncompleteBeta(a[0], a[1], a[2]); },
          [](const Arguments &a, double v) {
              return 6e-15 * (20 + a[0] + a[1]) * std::max(std::fabs(v), 0.1);
          }}},
    };
    const auto rows = ReadTable(TestData("gamma_family.dat"));
    ASSERT_GT(rows.size(), 700U);
    for (const auto &row : rows) {
        const Function &function = functions.at(row.name);
        EXPECT_NEAR(function.value(row.arguments), row.value,
                    function.bound(row.arguments, row.value))
            << row.text;
    }
}

TEST(GammaFamily, LimitsAndFaultsOfTheDomain) {
    EXPECT_EQ(qx::GammaFunction(5.0), 24.0);
    EXPECT_EQ(qx::GammaFunction(inf), inf);
    EXPECT_EQ(qx::GammaFunction(200.0), inf);
    for (const double x : {0.0, -1.0, -33.0, -34.0, -1e300, -inf, nan})
        EXPECT_TRUE(std::isnan(qx::GammaFunction(x))) << x;
    EXPECT_EQ(qx::LnGammaFunction(1.0), 0.0);
    EXPECT_EQ(qx::LnGammaFunction(2.0), 0.0);
    EXPECT_EQ(qx::LnGammaFunction(0.0), inf);
    EXPECT_EQ(qx::LnGammaFunction(inf), inf);
    for (const double x : {-1e-300, -inf, nan})
        EXPECT_TRUE(std::isnan(qx::LnGammaFunction(x))) << x;
    for (const double x : {0.0, 709.8, inf})
        EXPECT_EQ(qx::StirlingGamma(x), inf) << x;
    for (const double x : {-1.0, -inf, nan})
        EXPECT_TRUE(std::isnan(qx::StirlingGamma(x))) << x;

    EXPECT_EQ(qx::IncompleteGammaP(2.0, 0.0), 0.0);
    EXPECT_EQ(qx::IncompleteGammaQ(2.0, 0.0), 1.0);
    EXPECT_EQ(qx::IncompleteGammaP(2.0, inf), 1.0);
    EXPECT_EQ(qx::IncompleteGammaQ(2.0, inf), 0.0);
    EXPECT_EQ(qx::IncompleteGammaP(inf, 1.0), inf);
    EXPECT_EQ(qx::IncompleteGammaP(inf, 0.0), 0.0) << "does not stop at the infinite a";
    EXPECT_EQ(qx::IncompleteGammaQ(inf, 0.0), inf) << "stops at the infinite a";
    EXPECT_EQ(qx::IncompleteGammaQ(0.5, 1e200), 0.0);
    for (const auto &[a, x] : {std::pair{nan, 1.0},
                               {1.0, nan},
                               {-inf, 1.0},
                               {1.0, -inf},
                               {1.0, -1.0},
                               {0.0, 1.0},
                               {-2.0, 1.0}}) {
        EXPECT_TRUE(std::isnan(qx::IncompleteGammaP(a, x))) << a << " " << x;
        EXPECT_TRUE(std::isnan(qx::IncompleteGammaQ(a, x))) << a << " " << x;
    }

    EXPECT_EQ(qx::IncompleteBeta(1.0, 1.0, 0.3), 0.3);
    EXPECT_EQ(qx::IncompleteBeta(1.0, 1e-13, 0.5), -1e-13 * std::log(0.5));
    EXPECT_EQ(qx::IncompleteBeta(2.0, 3.0, 0.0), 0.0);
    EXPECT_EQ(qx::IncompleteBeta(2.0, 3.0, 1.0), 1.0);
    for (const auto &[a, b, x] : {std::tuple{nan, 1.0, 0.5},
                                  {1.0, inf, 0.5},
                                  {1.0, 1.0, nan},
                                  {-1.0, 1.0, 0.5},
                                  {1.0, -1.0, 0.5},
                                  {1.0, 1.0, -0.1},
                                  {1.0, 1.0, 1.1}})
        EXPECT_TRUE(std::isnan(qx::IncompleteBeta(a, b, x))) << a << " " << b << " " << x;
}

// Calls with any bit pattern return; functions without a bound on their loop are left out (see
// gamma.h).
TEST(GammaFamily, TakesAnyBitPattern) {
    std::mt19937_64 random(7);
    const auto any = [&] { return std::bit_cast<double>(random()); };
    double sum = 0;
    for (int i = 0; i < 100000; ++i) {
        const double a = any();
        const double x = any();
        const double b = any();
        sum += std::isnan(qx::GammaFunction(x)) + std::isnan(qx::LnGammaFunction(x)) +
               std::isnan(qx::IncompleteBeta(a, b, std::fabs(x) < 1 ? std::fabs(x) : 0.3));
        if (std::fabs(a) < 1e8)
            sum += std::isnan(qx::IncompleteGammaP(a, x)) + std::isnan(qx::IncompleteGammaQ(a, x));
    }
    EXPECT_GT(sum, 0);
}

} // namespace
} // namespace qx::test
