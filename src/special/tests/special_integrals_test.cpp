#include "qx/special_integrals.h"

#include "special/tests/exports.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>

namespace qx::test {
namespace {

typedef const qx::test::Arguments &In;

const qx::test::ExportMap &Exports() {
    static const qx::test::ExportMap exports = {
        {"Erf", [](In a, double *o) { QX_Erf(a[0], o); }},
        {"ErfC", [](In a, double *o) { QX_ErfC(a[0], o); }},
        {"ExpI", [](In a, double *o) { QX_ExpI(a[0], Whole(a[1]), o); }},
        {"ExpI2026", [](In a, double *o) { QX_ExpI_2026(a[0], Whole(a[1]), o); }},
        {"SinI", [](In a, double *o) { QX_SinI(a[0], o); }},
        {"CosI", [](In a, double *o) { QX_CosI(a[0], o); }},
        {"SinhI", [](In a, double *o) { QX_SinhI(a[0], o); }},
        {"CoshI", [](In a, double *o) { QX_CoshI(a[0], o); }},
        {"Diln", [](In a, double *o) { QX_Diln(a[0], o); }},
        {"Dawson", [](In a, double *o) { QX_Dawson(a[0], o); }},
        {"FresnelIntegrals", [](In a, double *o) { QX_FresnelIntegrals(a[0], o, o + 1); }},
    };
    return exports;
}

double Value(const char *name, double a, double b = 0) {
    return qx::test::Value(Exports(), name, {a, b});
}

TEST(SpecialIntegrals, AgreesWithReferencesOnBothSidesOfEachThreshold) {
    EXPECT_GT(qx::test::ExpectAgreement(Exports(), qx::test::TestData("integrals.dat")), 380);
}

TEST(SpecialIntegrals, KeepsTheRulesOfDomainsAndLimits) {
    const double halfPi = 1.5707963267948966;
    const qx::test::Rule rules[] = {
        {"Erf", {0}, 0},
        {"Erf", {kNaN}, kNaN},
        {"Erf", {kInfinity}, 1},
        {"Erf", {-kInfinity}, -1},
        {"Erf", {-1e300}, -1},
        {"ErfC", {0}, 1},
        {"ErfC", {kNaN}, kNaN},
        {"ErfC", {27}, 0}, // -x^2 below -709.78
        {"ErfC", {-27}, 2},
        {"ErfC", {kInfinity}, 0},
        {"ErfC", {-kInfinity}, 2},
        {"ExpI", {kNaN, 1}, kNaN},
        {"ExpI", {kInfinity, 1}, kNaN},
        {"ExpI2026", {kInfinity, 1}, kNaN},
        {"ExpI2026", {-1, 1}, kNaN},
        {"ExpI2026", {kNaN, 1}, kNaN},
        {"ExpI2026", {0, 1}, kInfinity},
        {"ExpI2026", {800, 1}, 0},
        {"ExpI2026", {0, 5}, 0.25},
        {"ExpI", {1, -1}, kNaN},
        {"ExpI", {-1, 1}, kNaN},
        {"ExpI", {-1e-300, 2}, kNaN},
        {"ExpI", {710, 1}, 0},
        {"ExpI", {710, 0}, 0},
        {"ExpI", {1e300, 6000}, 0},
        {"ExpI", {0, 0}, kInfinity},
        {"ExpI", {0, 1}, kInfinity},
        {"ExpI", {0, 2}, 1},
        {"ExpI", {0, 5}, 0.25},
        {"ExpI", {0, 2147483647}, 1 / 2147483646.0},
        {"SinI", {0}, 0},
        {"SinI", {kInfinity}, halfPi},
        {"SinI", {-kInfinity}, -halfPi},
        {"SinI", {kNaN}, kNaN},
        {"SinI", {1e-300}, 1e-300},
        {"CosI", {0}, -kInfinity},
        {"CosI", {kInfinity}, 0},
        {"CosI", {-kInfinity}, 0},
        {"CosI", {kNaN}, kNaN},
        {"SinhI", {0}, 0},
        {"SinhI", {1e-300}, 1e-300},
        {"SinhI", {kInfinity}, kInfinity},
        {"SinhI", {-kInfinity}, -kInfinity},
        {"SinhI", {881}, kInfinity},
        {"SinhI", {-881}, -kInfinity},
        {"SinhI", {-1e300}, -kInfinity},
        {"SinhI", {kNaN}, kNaN},
        {"CoshI", {0}, -kInfinity},
        {"CoshI", {881}, kInfinity},
        {"CoshI", {-881}, kInfinity},
        {"CoshI", {kInfinity}, kInfinity},
        {"CoshI", {-kInfinity}, kInfinity},
        {"CoshI", {kNaN}, kNaN},
        {"Diln", {1}, 0},
        {"Diln", {0}, 1.6449340668482264}, // pi^2 / 6
        {"Diln", {-1e-300}, kNaN},
        {"Diln", {-kInfinity}, kNaN},
        {"Diln", {kNaN}, kNaN},
        {"Dawson", {kInfinity, 0}, kNaN},
        {"Dawson", {kNaN, 0}, kNaN},
        {"Dawson", {-1e10, 0}, -0.5e-10},
        {"FresnelIntegrals", {-kInfinity, 0}, -0.5},
        {"FresnelIntegrals", {0x1p53}, 0.5},
    };
    for (const auto &rule : rules)
        qx::test::ExpectRule(Exports(), rule);
    // From 2^53 on, x^2 / 4 is whole, so S is 1/2 - 1 / (pi x): at 2^53 the next number below 1/2.
    const auto sine = [](double x) {
        return qx::test::Value(Exports(), "FresnelIntegrals", {x}, 1);
    };
    EXPECT_EQ(sine(0x1p53), 0.5 - 0x1p-54);
    EXPECT_EQ(sine(-0x1p53), -0.5 + 0x1p-54);
    EXPECT_EQ(sine(0x1p60), 0.5);
}

TEST(SpecialIntegrals, RecurrencesAndReflectionsHold) {
    for (const double x : {0.003, 0.3, 0.99, 1.01, 4.4, 30.0}) {
        const double front = std::exp(-x);
        for (const int n : {1, 2, 9, 80}) // n E_(n+1) = exp(-x) - x E_n
            EXPECT_NEAR(n * Value("ExpI", x, n + 1), front - x * Value("ExpI", x, n),
                        4e-15 * front * (1 + x))
                << x << ' ' << n;
        EXPECT_EQ(Value("SinI", -x), -Value("SinI", x)) << x;
        EXPECT_EQ(Value("CosI", -x), Value("CosI", x)) << x;
        EXPECT_EQ(Value("SinhI", -x), -Value("SinhI", x)) << x;
        EXPECT_EQ(Value("CoshI", -x), Value("CoshI", x)) << x;
        EXPECT_NEAR(Value("Erf", -x), -Value("Erf", x), 3e-16) << x; // 1 - (2 - y) below -1
        EXPECT_NEAR(Value("Erf", x) + Value("ErfC", x), 1, 3e-16) << x;
        EXPECT_NEAR(Value("ErfC", x) + Value("ErfC", -x), 2, 5e-16) << x;
        // Shi(x) - Chi(x) = E_1(x)
        EXPECT_NEAR(Value("CoshI", x) - Value("SinhI", x), -Value("ExpI", x, 1),
                    1e-14 * (1 + std::fabs(Value("CoshI", x))))
            << x;
        // Li2(1 - x) + Li2(1 - 1 / x) = -ln^2(x) / 2
        const double log = std::log(x);
        EXPECT_NEAR(Value("Diln", x) + Value("Diln", 1 / x), -0.5 * log * log,
                    1e-14 * (1 + log * log))
            << x;
    }
}

TEST(SpecialIntegrals, ReturnsSoonForAnyArgument) { qx::test::ExpectSoon(Exports(), 1000000); }

TEST(SpecialIntegrals, LeavesNoStepAtAThreshold) {
    const qx::test::Seam seams[] = {
        {"Erf", {1}, 0, 1e-15},
        {"ErfC", {1}, 0, 2e-15},
        {"ErfC", {8}, 0, 5e-14}, // the step of the argument is amplified 128 times
        {"ExpI", {1, 1}, 0, 1e-14},
        {"ExpI", {1, 40}, 0, 1e-14},
        {"ExpI2026", {0.4, 1}, 0, 1e-15},
        {"ExpI2026", {2, 1}, 0, 1e-15},
        {"ExpI2026", {10, 1}, 0, 4e-15},
        {"SinI", {4}, 0, 1e-15},
        {"SinI", {8}, 0, 1e-15},
        {"CosI", {4}, 0, 1e-14},
        {"CosI", {8}, 0, 1e-14},
        {"SinhI", {8}, 0, 1e-14},
        {"SinhI", {18}, 0, 1e-13},
        {"CoshI", {8}, 0, 1e-14},
        {"CoshI", {18}, 0, 1e-13},
        {"Diln", {0.5}, 0, 1e-15},
        {"Diln", {1.5}, 0, 2e-15},
        {"Diln", {2}, 0, 1e-15},
        {"Dawson", {3.25, 0}, 0, 1e-14},
        {"Dawson", {6.25, 0}, 0, 1e-14},
        {"FresnelIntegrals", {1.6, 0}, 0, 1e-14},
        {"FresnelIntegrals", {3, 0}, 0, 1e-14},
    };
    for (const auto &seam : seams)
        qx::test::ExpectNoStep(Exports(), seam);
}

} // namespace
} // namespace qx::test
