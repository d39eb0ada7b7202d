#include "special/direct_tails.h"
#include "special/normal_tail.h"
#include "special/tail_integrals.h"
#include "special/wide_number.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>

namespace qx::test {
namespace {

constexpr double eps = 0x1p-52;
constexpr double inf = std::numeric_limits<double>::infinity();

// Against the same parts by quadrature, a different method. A part that is hardly above a half may
// be on the other side there.
void ExpectSame(const DirectTails &direct, const Tails &tails, const char *name, double a, double b,
                double at) {
    ASSERT_TRUE(direct.isKnown) << name << ' ' << a << ' ' << b << ' ' << at;
    const double part = tails.part(direct.isLower), slope = tails.slope.value();
    EXPECT_NEAR(direct.smaller, part, 7 * eps * part) << name << ' ' << a << ' ' << b << ' ' << at;
    EXPECT_NEAR(direct.slope, slope, 6 * eps * slope) << name << ' ' << a << ' ' << b << ' ' << at;
    EXPECT_LT(direct.smaller, 0.65) << name << ' ' << a << ' ' << b << ' ' << at;
}

TEST(DirectTails, AgreeWithTheIntegrals) {
    std::mt19937_64 engine(3);
    const auto uniform = [&](double low, double high) {
        return std::uniform_real_distribution<double>(low, high)(engine);
    };
    for (int i = 0; i < 3000; ++i) {
        // whole, half and other parameters, from the least to the largest
        const auto parameter = [&](double most) {
            const double a = std::exp(uniform(std::log(0.5), std::log(most)));
            return i % 3 == 0 ? std::ceil(a) : i % 3 == 1 ? std::ceil(2 * a) / 2 : a;
        };
        const double g = parameter(200), x = g * std::exp(uniform(-4, 3) / std::sqrt(g));
        ExpectSame(qx::DirectGammaTails(g, x), qx::GammaTails(g, x), "gamma", g, 0, x);
        const double a = parameter(25), b = parameter(25);
        const double f = std::exp(uniform(-4, 4) * std::sqrt(1 / a + 1 / b));
        const UnitPoint point = UnitPoint::Share(qx::ExactProduct(f, a), {b, 0.0});
        const Tails tails = qx::BetaTails(a, b, point);
        ExpectSame(qx::DirectBetaTails(f, a, b, tails.isLower), tails, "beta", a, b, f);
    }
}

TEST(DirectTails, AreUnknownOutsideTheirRange) {
    for (const double a : {0.0, 0.49, 200.5, inf, std::nan("")})
        EXPECT_FALSE(qx::DirectGammaTails(a, 1.0).isKnown) << a;
    for (const double x : {0.0, 1e-290, 5000.0, inf, std::nan("")})
        EXPECT_FALSE(qx::DirectGammaTails(3.0, x).isKnown) << x;
    for (const double a : {0.49, 25.5, std::nan("")}) {
        EXPECT_FALSE(qx::DirectBetaTails(1.0, a, 2.0, true).isKnown) << a;
        EXPECT_FALSE(qx::DirectBetaTails(1.0, 2.0, a, false).isKnown) << a;
    }
    EXPECT_FALSE(qx::DirectBetaTails(1e-200, 3.0, 3.0, true).isKnown);
}

// On both sides of the ends of the pieces; erfc of the C++ library loses no more than 1 eps there.
TEST(DirectTails, NormalTailHasNoStepBetweenPieces) {
    for (double x = 0.25; x <= 10.0; x += 0.25) {
        const double below = qx::ScaledNormalTail(std::nextafter(x, 0.0));
        EXPECT_NEAR(below, qx::ScaledNormalTail(x), 2 * eps * below) << x;
    }
    EXPECT_EQ(qx::ScaledNormalTail(0.0), 0.5);
}

// The recurrence and the reflection of gamma, in units of two doubles.
TEST(DirectTails, GammaInTwoDoublesSatisfiesItsEquations) {
    const auto relative = [](const qx::Wide &a, const qx::Wide &b) {
        const qx::Wide quotient = a / b; // 1, as 0.5 times 2
        const Extended rest = Extended{std::ldexp(quotient.value.high, quotient.exponent),
                                       std::ldexp(quotient.value.low, quotient.exponent)} -
                              Extended{1.0, 0.0};
        return std::fabs(rest.high + rest.low);
    };
    for (const double x : {0.001, 0.5, 0.99, 1.0, 1.37, 2.0, 7.25, 28.9, 29.5, 30.5}) {
        const qx::Wide at = qx::GammaOf({x, 0.0}).gamma.value;
        const qx::Wide next = qx::GammaOf(qx::ExactSum(x, 1.0)).gamma.value;
        EXPECT_LT(relative(next, at * qx::WideOf({x, 0.0})), 0x1p-84) << x;
    }
    for (const int n : {-1, -2, -30})
        EXPECT_TRUE(qx::GammaOf({static_cast<double>(n), 0.0}).isPole);
    // gamma(1/2) gamma(1/2) is pi, gamma(-3/2) gamma(5/2) is pi too
    const qx::Wide pi = qx::WideOf({0x1.921fb54442d18p+1, 0x1.1a62633145c07p-53});
    const qx::Wide half = qx::GammaOf({0.5, 0.0}).gamma.value;
    EXPECT_LT(relative(half * half, pi), 0x1p-90);
    const qx::Wide turned =
        qx::GammaOf({-1.5, 0.0}).gamma.value * qx::GammaOf({2.5, 0.0}).gamma.value;
    EXPECT_LT(relative(turned, pi), 0x1p-90);
}

} // namespace
} // namespace qx::test
