#include "qx/special_bessel.h"

#include "special/tests/exports.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace qx::test {
namespace {

typedef const qx::test::Arguments &In;

const qx::test::ExportMap &Exports() {
    static const qx::test::ExportMap exports = {
        {"Airy", [](In a, double *o) { QX_Airy(a[0], o, o + 1, o + 2, o + 3); }},
        {"BesselJr", [](In a, double *o) { QX_BesselJr(a[0], a[1], o); }},
        {"BesselYr", [](In a, double *o) { QX_BesselYr(a[0], a[1], o); }},
        {"BesselJs", [](In a, double *o) { QX_BesselJs(Whole(a[0]), a[1], o); }},
        {"BesselYs", [](In a, double *o) { QX_BesselYs(Whole(a[0]), a[1], o); }},
        {"BesselIr", [](In a, double *o) { QX_BesselIr(a[0], a[1], o); }},
        {"BesselKn", [](In a, double *o) { QX_BesselKn(Whole(a[0]), a[1], o); }},
        {"KelvinI", [](In a, double *o) { QX_KelvinI(a[0], Whole(a[1]), o, o + 1); }},
        {"KelvinK", [](In a, double *o) { QX_KelvinK(a[0], Whole(a[1]), o, o + 1); }},
        {"Struve", [](In a, double *o) { QX_Struve(a[0], a[1], o); }},
        {"ParabolicCylinder", [](In a, double *o) { QX_ParabolicCylinder(a[0], a[1], o); }},
    };
    return exports;
}

double Value(const char *name, double a, double b = 0, int output = 0) {
    return qx::test::Value(Exports(), name, {a, b}, output);
}

TEST(SpecialBessel, AgreesWithReferencesOnBothSidesOfEachThreshold) {
    EXPECT_GT(qx::test::ExpectAgreement(Exports(), qx::test::TestData("bessel.dat")), 1000);
}

TEST(SpecialBessel, KeepsTheRulesOfDomainsAndLimits) {
    constexpr double largest = std::numeric_limits<double>::max();
    const qx::test::Rule rules[] = {
        {"BesselJr", {-200.5, 3}, kNaN},
        {"BesselJr", {0.5, -1}, kNaN},
        {"BesselJr", {kNaN, 1}, kNaN},
        {"BesselJr", {0.5, 1e-16}, 0},
        {"BesselJr", {0, 0}, 1},
        {"BesselJr", {3, 0}, 0},
        {"BesselJr", {2.5, kInfinity}, 0},
        {"BesselJr", {1e200, 3}, 0},
        {"BesselYr", {1e200, 3}, -kInfinity},
        {"BesselYr", {1.5, 0}, kNaN},
        {"BesselYr", {1, -1}, kNaN},
        {"BesselYr", {-201, 5}, kNaN},
        {"BesselJs", {0, 0}, 1},
        {"BesselJs", {2, 0}, 0},
        {"BesselJs", {0, 5e-324}, 1},
        {"BesselJs", {2, 5e-324}, 0},
        {"BesselYs", {-1, 5e-324}, 1},
        {"BesselYs", {-3, 5e-324}, 0},
        {"BesselJs", {2, -1}, kNaN},
        {"BesselJs", {2, kInfinity}, 0},
        {"BesselYs", {2, -1}, kNaN},
        {"BesselYs", {2, 0}, -kInfinity},
        {"BesselYs", {2, kInfinity}, 0},
        {"BesselIr", {-200.5, 1}, kNaN},
        {"BesselIr", {0.5, -1}, kNaN},
        {"BesselIr", {0.5, 0}, 0},
        {"BesselIr", {0, 0}, 1},
        {"BesselIr", {-0.5, 0}, kInfinity},
        {"BesselIr", {-1.5, 0}, -kInfinity},
        {"BesselKn", {1, -1}, kNaN},
        {"BesselKn", {3, 0}, kInfinity},
        {"BesselKn", {3, kInfinity}, 0},
        {"KelvinK", {0, 1}, kNaN},
        {"KelvinI", {0, 0}, 1},
        {"Struve", {0, -1}, kNaN},
        {"Struve", {0, 1}, 0},
        {"Struve", {-1, 0.5}, kNaN},
        {"Struve", {kInfinity, 1}, kNaN},
        {"ParabolicCylinder", {kInfinity, 2.5}, 0},
        {"ParabolicCylinder", {-kInfinity, 2}, 0},
        {"ParabolicCylinder", {-kInfinity, 0.5}, -kInfinity},
        {"ParabolicCylinder", {1, kInfinity}, kNaN},
        {"Airy", {104, 0}, 0},
        {"Airy", {kNaN, 0}, kNaN},
    };
    for (const auto &rule : rules)
        qx::test::ExpectRule(Exports(), rule);
    EXPECT_EQ(Value("Airy", 104, 0, 1), 0);
    EXPECT_EQ(Value("Airy", 104, 0, 2), largest);
    EXPECT_EQ(Value("Airy", 104, 0, 3), largest);
}

// Near the ends of the range, a value is finite or infinite exactly where the true value is, with
// the right sign; references from mpmath.
TEST(SpecialBessel, OverflowsWhereTheValueDoes) {
    EXPECT_NEAR(Value("Struve", 2.9e-8, -34.69) / 4.1428455173572960447e+300, 1.0, 1e-12);
    EXPECT_EQ(Value("BesselYr", 10.3, 1e-100), -kInfinity);
    EXPECT_EQ(Value("BesselYr", 14.5, 1e-30), -kInfinity);
    EXPECT_EQ(Value("BesselYr", -10.3, 1e-100), -kInfinity);
    EXPECT_EQ(Value("BesselYr", -11.3, 1e-100), kInfinity);
    EXPECT_EQ(Value("BesselYr", -14.8, 1e-60), kInfinity);
    EXPECT_EQ(Value("BesselYs", 14, 1e-60), -kInfinity);
    const struct {
        double x, n, ker, kei;
    } points[] = {{0.5, 400, kInfinity, -kInfinity},
                  {0.5, 401, -kInfinity, -kInfinity},
                  {0.01, 150, -kInfinity, -kInfinity},
                  {3, 1000, kInfinity, -kInfinity}};
    for (const auto &p : points) {
        EXPECT_EQ(Value("KelvinK", p.x, p.n, 0), p.ker) << p.n;
        EXPECT_EQ(Value("KelvinK", p.x, p.n, 1), p.kei) << p.n;
    }
}

TEST(SpecialBessel, FoldsSigns) {
    EXPECT_EQ(Value("BesselJr", -3, 2.2), -Value("BesselJr", 3, 2.2));
    EXPECT_EQ(Value("BesselJr", 3, -2.2), -Value("BesselJr", 3, 2.2));
    EXPECT_EQ(Value("BesselJr", -3, -2.2), Value("BesselJr", 3, 2.2));
    EXPECT_EQ(Value("BesselKn", -4, 2.2), Value("BesselKn", 4, 2.2));
    EXPECT_EQ(Value("KelvinI", 2.2, -3), -Value("KelvinI", 2.2, 3));
    EXPECT_EQ(Value("KelvinI", -2.2, 3), -Value("KelvinI", 2.2, 3));
    EXPECT_EQ(Value("Struve", -2.2, 1), Value("Struve", 2.2, 1));
}

TEST(SpecialBessel, ReturnsSoonForAnyArgument) { qx::test::ExpectSoon(Exports(), 1000000); }

TEST(SpecialBessel, LeavesNoStepAtAThreshold) {
    const qx::test::Seam seams[] = {
        {"Airy", {-2.09, 0}, 0, 1e-14},
        {"Airy", {2.09, 0}, 0, 1e-13},
        {"BesselJr", {0, 8}, 1, 1e-13},
        {"BesselYr", {1, 8}, 1, 1e-13},
        {"BesselJr", {0.3, 12.9277}, 1, 1e-9},
        {"BesselIr", {2.5, 40}, 1, 1e-13},
        {"KelvinI", {5, 3}, 0, 1e-13},
        {"KelvinK", {2, 3}, 0, 1e-13},
        {"ParabolicCylinder", {1, -0.7}, 0, 1e-13},
        {"Struve", {18, 1}, 0, 1e-12},
    };
    for (const auto &seam : seams)
        qx::test::ExpectNoStep(Exports(), seam);
}

} // namespace
} // namespace qx::test
