#include "qx/special_elliptic.h"

#include "special/tests/exports.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>

namespace qx::test {
namespace {

typedef const Arguments &In;

const ExportMap &Exports() {
    static const ExportMap exports = {
        {"Elliptic1", [](In a, double *o) { QX_Elliptic1(a[0], a[1], o); }},
        {"Elliptic1_2026", [](In a, double *o) { QX_Elliptic1_2026(a[0], a[1], o, 0); }},
        {"Elliptic2", [](In a, double *o) { QX_Elliptic2(a[0], a[1], o); }},
        {"EllipticJ", [](In a, double *o) { QX_EllipticJ(a[0], a[1], o, o + 1, o + 2, o + 3); }},
    };
    return exports;
}

double Value(const char *name, double a, double b = 0, int output = 0) {
    return test::Value(Exports(), name, {a, b}, output);
}

TEST(SpecialElliptic, AgreesWithReferencesOnBothSidesOfEachThreshold) {
    EXPECT_GT(ExpectAgreement(Exports(), TestData("elliptic.dat")), 250);
}

TEST(SpecialElliptic, KeepsTheRulesOfDomainsAndLimits) {
    const Rule rules[] = {
        {"Elliptic1", {-0.1, 1}, kNaN},        {"Elliptic1", {1.1, kNaN}, kNaN},
        {"Elliptic1", {1, kNaN}, kInfinity},   {"Elliptic2", {1, kNaN}, 1},
        {"Elliptic1", {0, 0.75}, 0.75},        {"Elliptic1", {0.5, 0}, 0},
        {"EllipticJ", {1, 1.5}, kNaN},         {"Elliptic1_2026", {1, kNaN}, kNaN},
        {"Elliptic1_2026", {1, 2}, kInfinity}, {"Elliptic1_2026", {1, -0.0}, 0},
    };
    for (const auto &rule : rules)
        ExpectRule(Exports(), rule);
}

TEST(SpecialElliptic, SelectsTheCompleteForms) {
    double complete = 0;
    QX_Elliptic1_85(0.3, 0.5, &complete, 1);
    EXPECT_EQ(complete, Value("Elliptic1", 0.3, kNaN));
    QX_Elliptic1_85(0.3, 0.5, &complete, 2); // any value except 1
    EXPECT_EQ(complete, Value("Elliptic1", 0.3, 0.5));
    QX_Elliptic1_2026(1, 0.5, &complete, 1);
    EXPECT_EQ(complete, kInfinity);
    QX_Elliptic2_85(0.3, 0.5, &complete, 1);
    EXPECT_EQ(complete, Value("Elliptic2", 0.3, kNaN));
    QX_Elliptic2_85(0.3, kNaN, &complete, 0); // here a NaN selects nothing
    EXPECT_TRUE(std::isnan(complete));

    double sn = 0;
    QX_EllipticJ(0.5, 0.3, &sn, nullptr, nullptr, nullptr);
    EXPECT_EQ(sn, Value("EllipticJ", 0.5, 0.3));
    // the amplitude is the inverse of F, also past a quarter period
    EXPECT_NEAR(Value("Elliptic1", 0.3, Value("EllipticJ", 7.5, 0.3, 3)), 7.5, 1e-13);
}

// For tan(phi)^2 = 1 / sqrt(1 - m), the integrals are K / 2 and (E + 1 - sqrt(1 - m)) / 2. The
// transformation then doubles phi to pi / 2, where rounding makes the tangent positive, negative or
// infinite.
TEST(SpecialElliptic, IsAccurateWhereTheTransformationReachesQuarterTurns) {
    for (int i = 1; i < 2000; ++i) {
        const double m = i / 2000.0 + 1e-5 * std::sin(i);
        const double root = std::sqrt(1 - m);
        double phi = std::atan(std::sqrt(1 / root));
        for (int steps = 0; steps < 3; ++steps)
            phi = std::nextafter(phi, 0.0);
        const double first = Value("Elliptic1", m, kNaN) / 2;
        const double second = (Value("Elliptic2", m, kNaN) + 1 - root) / 2;
        for (int steps = 0; steps < 7; ++steps, phi = std::nextafter(phi, 2.0)) {
            EXPECT_NEAR(Value("Elliptic1", m, phi), first, 2e-14) << m << " " << phi;
            EXPECT_NEAR(Value("Elliptic2", m, phi), second, 2e-14) << m << " " << phi;
        }
    }
    EXPECT_NEAR(Value("Elliptic1", 0.68359375000000011, 0.9272952180016123), 1.0259330100195333,
                1e-15)
        << "an infinite tangent";
}

TEST(SpecialElliptic, ReturnsSoonForAnyArgument) { ExpectSoon(Exports(), 1000000); }

TEST(SpecialElliptic, LeavesNoStepAtAThreshold) {
    const Seam seams[] = {
        {"Elliptic1", {0.5, kNaN}, 0, 1e-14},
    };
    for (const auto &seam : seams)
        ExpectNoStep(Exports(), seam);
}

} // namespace
} // namespace qx::test
