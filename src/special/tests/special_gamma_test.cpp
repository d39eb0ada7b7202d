#include "qx/special_gamma.h"

#include "special/tests/exports.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>

namespace qx::test {
namespace {

typedef const qx::test::Arguments &In;

const qx::test::ExportMap &Exports() {
    static const qx::test::ExportMap exports = {
        {"Beta", [](In a, double *o) { QX_Beta(a[0], a[1], a[2], o); }},
        {"BetaComplete", [](In a, double *o) { QX_Beta(a[0], a[1], kNaN, o); }},
        {"Fact", [](In a, double *o) { QX_Fact(Whole(a[0]), o); }},
        {"LnFact", [](In a, double *o) { QX_LnFact(Whole(a[0]), o); }},
        {"GammaP", [](In a, double *o) { QX_Gamma(a[0], a[1], o); }},
        {"GammaComplete", [](In a, double *o) { QX_Gamma(a[0], kNaN, o); }},
        {"GammaC", [](In a, double *o) { QX_GammaC(a[0], a[1], o); }},
        {"LnGamma", [](In a, double *o) { QX_LnGamma(a[0], o); }},
        {"Stirling", [](In a, double *o) { QX_Stirling(a[0], o); }},
        {"Psi", [](In a, double *o) { QX_Psi(a[0], o); }},
        {"Zeta", [](In a, double *o) { QX_Zeta(a[0], o); }},
    };
    return exports;
}

double Value(const char *name, double a, double b = 0, double c = 0) {
    return qx::test::Value(Exports(), name, {a, b, c});
}

TEST(SpecialGamma, AgreesWithReferencesOnBothSidesOfEachThreshold) {
    EXPECT_GT(qx::test::ExpectAgreement(Exports(), qx::test::TestData("gamma.dat")), 200);
}

// Arguments for which the gamma functions of the definition overflow or underflow; mpmath at 30
// digits.
TEST(SpecialGamma, CompleteBetaOfLargeNegativeArguments) {
    const struct {
        double a, b, value;
    } points[] = {
        {-100.1, -99.1, -1.005181917797697816e+60},  {-180.5, 200.25, -2.9735734452571381313e+26},
        {-60.3, -10.7, -0.082978189267207851327},    {-55.5, 30.25, 5.3697741269673577702e-18},
        {-200.7, 3.3, -8.1055830884704666487e-8},    {-51.2, 51.45, 0.076877834205739345071},
        {-120.4, 60.9, -1.3675577814054160216e-37},  {-300.3, -0.4, -36.502065585336312088},
        {-170.6, 100.35, 7.6060403420021200544e-52}, {-0.3, 60.2, -14.744765627658186662},
        {-3.3, 1000.7, 3466623073.218291045},        {-51.25, 0.75, -0.09030933984921073535},
    };
    for (const auto &p : points) {
        EXPECT_NEAR(Value("BetaComplete", p.a, p.b) / p.value, 1.0, 2.7e-15) << p.a << ' ' << p.b;
        EXPECT_EQ(Value("BetaComplete", p.a, p.b), Value("BetaComplete", p.b, p.a));
    }
    EXPECT_EQ(Value("BetaComplete", -60.5, 30.5), 0) << "a pole of gamma(a + b)";
    EXPECT_TRUE(std::isnan(Value("BetaComplete", -60, 30.5)));
    EXPECT_TRUE(std::isnan(Value("BetaComplete", -60.5, -3)));
}

TEST(SpecialGamma, KeepsTheRulesOfDomainsAndLimits) {
    const qx::test::Rule rules[] = {
        {"Psi", {kInfinity}, kInfinity},
        {"Psi", {-kInfinity}, kNaN},
        {"Psi", {kNaN}, kNaN},
        {"Psi", {0}, kInfinity},
        {"Psi", {-0.0}, kInfinity},
        {"Psi", {-7}, kInfinity},
        {"Psi", {-1e300}, kInfinity},
        {"Fact", {-1}, kNaN},
        {"Fact", {0}, 1},
        {"Fact", {171}, kInfinity},
        {"Fact", {2147483647}, kInfinity},
        {"LnFact", {-1}, kNaN},
        {"LnFact", {-2147483648.0}, kNaN},
        {"LnFact", {0}, 0},
        {"LnFact", {1}, 0},
        {"LnGamma", {-1e-300}, kNaN},
        {"LnGamma", {0}, kInfinity},
        {"LnGamma", {1}, 0},
        {"LnGamma", {2}, 0},
        {"LnGamma", {kInfinity}, kInfinity},
        {"Stirling", {0}, kInfinity},
        {"Stirling", {709.782712893384}, kInfinity},
        {"Stirling", {kInfinity}, kInfinity},
        {"Stirling", {-1}, kNaN},
        {"GammaComplete", {0}, kNaN},
        {"GammaComplete", {-5}, kNaN},
        {"GammaComplete", {-40}, kNaN},
        {"GammaComplete", {-kInfinity}, kNaN},
        {"GammaComplete", {kNaN}, kNaN},
        {"GammaComplete", {kInfinity}, kInfinity},
        {"GammaComplete", {5}, 24},
        {"GammaP", {2, kInfinity}, 1},
        {"GammaP", {2, 0}, 0},
        {"GammaP", {2, -1}, kNaN},
        {"GammaP", {0, 1}, kNaN},
        {"GammaP", {kInfinity, 1}, kInfinity},
        {"GammaC", {2, kInfinity}, 0},
        {"GammaC", {2, 0}, 1},
        {"GammaC", {-2, 1}, kNaN},
        {"GammaC", {2, kNaN}, kNaN}, // NaN does not select a form here
        {"BetaComplete", {kInfinity, 1}, kNaN},
        {"BetaComplete", {1, -kInfinity}, kNaN},
        {"BetaComplete", {kNaN, 1}, kNaN},
        {"Beta", {0, 2, 0.3}, 1},
        {"Beta", {5e-324, 2, 0.3}, 1},
        {"Beta", {1e-310, 2, 0.3}, 1},
        {"Beta", {0, 5e-324, 0.3}, 1},
        {"Beta", {2, 0, 0.3}, 0},
        {"Beta", {5e-324, 5e-324, 0.3}, 0.5},
        {"Beta", {0, 0, 0.3}, kNaN},
        {"Beta", {1, 1, 0.3}, 0.3},
        {"Beta", {2, 3, 0}, 0},
        {"Beta", {2, 3, 1}, 1},
        {"Beta", {-2, 3, 0.5}, kNaN},
        {"Beta", {2, 3, 1.5}, kNaN},
        {"Beta", {2, 3, kInfinity}, kNaN},
        {"Zeta", {kInfinity, 0}, kInfinity},
        {"Zeta", {1, 0}, kInfinity},
        {"Zeta", {-kInfinity, 0}, kNaN},
        {"Zeta", {-30.82, 0}, kNaN},
        {"Zeta", {127, 0}, 1},
        {"Zeta", {-4, 0}, 0},
    };
    for (const auto &rule : rules)
        qx::test::ExpectRule(Exports(), rule);
}

TEST(SpecialGamma, SelectsTheCompleteFormByNaNAndBySelector) {
    double value = 0;
    QX_Gamma_85(2.5, 1.5, &value, 1);
    EXPECT_EQ(value, Value("GammaComplete", 2.5));
    for (const int32_t selector : {0, 2, -1}) {
        QX_Gamma_85(2.5, 1.5, &value, selector);
        EXPECT_EQ(value, Value("GammaP", 2.5, 1.5));
    }
    QX_Gamma_85(2.5, kNaN, &value, 0); // here a NaN selects nothing
    EXPECT_TRUE(std::isnan(value));

    QX_Beta_85(2.5, 1.5, 0.25, &value, 1); // x is ignored
    EXPECT_EQ(value, Value("BetaComplete", 2.5, 1.5));
    QX_Beta_85(2.5, 1.5, 0.25, &value, 0);
    EXPECT_EQ(value, Value("Beta", 2.5, 1.5, 0.25));
    QX_Beta_85(2.5, 1.5, kNaN, &value, 0);
    EXPECT_TRUE(std::isnan(value));
}

TEST(SpecialGamma, RecurrencesAndReflectionsHold) {
    for (const double x : {0.01, 0.7, 3.3, 9.9, 17.2, 60.5}) {
        EXPECT_NEAR(Value("Psi", x + 1), Value("Psi", x) + 1 / x, 1e-14 * (1 + 1 / x)) << x;
        EXPECT_NEAR(Value("GammaP", x, 1.3 * x) + Value("GammaC", x, 1.3 * x), 1, 1e-15) << x;
        EXPECT_NEAR(Value("BetaComplete", x, 2.5) * (x / (x + 2.5)), // B(a + 1, b)
                    Value("BetaComplete", x + 1, 2.5), 1e-13 * Value("BetaComplete", x + 1, 2.5))
            << x;
        EXPECT_NEAR(Value("Beta", x, 2.5, 0.4) + Value("Beta", 2.5, x, 0.6), 1, 1e-13) << x;
    }
    for (int n = 1; n <= 33; ++n) // rounded from 23! on
        EXPECT_NEAR(Value("Fact", n), n * Value("Fact", n - 1), 2.3e-16 * Value("Fact", n)) << n;
}

// If adding 1 does not change the shape, the ratio of successive terms of the series is as close to
// 1 as the shape is to x: the terms never decrease, or far too slowly.
TEST(SpecialGamma, ReturnsSoonForShapesBeyondTheIntegers) {
    for (const double a : {9007199254740992.0, 3e17, 2.4803007478524029e+65, 1e300})
        for (const double x : {a, a * (1 - 1e-12), a * (1 - 1e-6)}) {
            EXPECT_GE(Value("GammaP", a, x), 0) << a << ' ' << x;
            EXPECT_FALSE(Value("GammaC", a, x) > 1) << a << ' ' << x; // NaN after an overflow
        }
}

TEST(SpecialGamma, ReturnsSoonForAnyArgument) { qx::test::ExpectSoon(Exports(), 1000000); }

TEST(SpecialGamma, LeavesNoStepAtAThreshold) {
    const qx::test::Seam seams[] = {
        {"Psi", {10}, 0, 1e-14},
        {"Psi", {1e9}, 0, 1e-15},
        {"LnGamma", {33}, 0, 1e-15},
        {"LnGamma", {1000}, 0, 1e-15},
        {"GammaComplete", {33}, 0, 1e-13},
        {"GammaComplete", {-32.5}, 0, 1e-12},
        {"Stirling", {143.01608}, 0, 1e-12},
        {"GammaP", {0.5, 1}, 1, 1e-14},
        {"GammaP", {7.5, 7.5}, 1, 1e-14},
        {"GammaC", {7.5, 7.5}, 1, 1e-14},
        {"Beta", {4, 2, 0.6666666666666666}, 2, 1e-14},
        {"Zeta", {10, 0}, 0, 1e-14},
        {"Zeta", {50, 0}, 0, 1e-15},
    };
    for (const auto &seam : seams)
        qx::test::ExpectNoStep(Exports(), seam);
}

} // namespace
} // namespace qx::test
