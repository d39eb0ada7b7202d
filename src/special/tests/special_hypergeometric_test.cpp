#include "qx/special_hypergeometric.h"

#include "special/confluent.h"
#include "special/hypergeometric.h"
#include "special/hypergeometric_terms.h"
#include "special/tests/exports.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>
#include <random>

namespace qx::test {
namespace {

typedef const Arguments &In;

const ExportMap &Exports() {
    static const ExportMap exports = {
        {"Gauss", [](In a, double *o) { QX_Gauss(a[0], a[1], a[2], a[3], o); }},
        {"Gauss_2011", [](In a, double *o) { QX_Gauss_2011(a[0], a[1], a[2], a[3], o); }},
        {"Kummer", [](In a, double *o) { QX_Kummer(a[0], a[1], a[2], o); }},
        {"Tricomi", [](In a, double *o) { QX_Tricomi(a[0], a[1], a[2], o); }},
        {"Gauss_2026", [](In a, double *o) { QX_Gauss_2026(a[0], a[1], a[2], a[3], o); }},
        {"Kummer_2026", [](In a, double *o) { QX_Kummer_2026(a[0], a[1], a[2], o); }},
        {"Tricomi_2026", [](In a, double *o) { QX_Tricomi_2026(a[0], a[1], a[2], o); }},
    };
    return exports;
}

double Value(const char *name, double x, double a, double b, double c = 0) {
    return test::Value(Exports(), name, {x, a, b, c});
}

TEST(SpecialHypergeometric, AgreesWithReferencesInEachForm) {
    EXPECT_GT(ExpectAgreement(Exports(), TestData("hypergeometric.dat")), 750);
}

TEST(SpecialHypergeometric, KeepsTheRulesOfDomainsAndLimits) {
    const Rule rules[] = {
        {"Gauss", {kNaN, 1, 2, 3}, kNaN},
        {"Gauss", {0.5, kNaN, 2, 3}, kNaN},
        {"Gauss", {0.5, 1, kInfinity, 3}, kNaN},
        {"Gauss", {0.5, 1, 2, -kInfinity}, kNaN},
        {"Gauss", {kInfinity, 0, 2, 3}, kNaN},
        {"Gauss", {1.0000001, -2, 2, 3}, kNaN},
        {"Gauss", {-1.0000001, 1, 2, 3}, kNaN},
        {"Gauss", {1, 1, 2, 3}, kNaN},     // c = a + b
        {"Gauss", {1, -2, 2, -0.5}, kNaN}, // even though the series terminates
        {"Gauss", {0, 1, 2, 3}, 1},
        {"Gauss", {0.5, 0, 2, 3}, 1},
        {"Gauss", {0.5, 1, 0, -2}, 1},
        {"Gauss", {0.5, 1, 2, 0}, kInfinity},
        {"Gauss", {0.5, 1, 2, -3}, kInfinity},
        {"Gauss", {0, 1, 2, -3}, kInfinity},
        {"Gauss", {0.5, -5, 2, -3}, kInfinity}, // terminates after the pole
        {"Gauss", {-1, -3, 2, -3}, kInfinity},  // terminates at the pole
        {"Gauss", {-1, 2, -3, -3}, kInfinity},
        {"Gauss", {0.5, 2, 3, 3}, 4},
        {"Gauss", {0.5, -3, 2.5, -3}, std::pow(0.5, -2.5)}, // c = a takes precedence over the pole
        {"Gauss", {1, 2, -1.5, 1}, 0},                      // c - a is a pole of gamma
        {"Gauss", {0.5, -2, 4, 4}, 0.25},
        {"Gauss_2011", {1.5, 1, 2, 3}, kNaN},
        {"Gauss_2011", {0.5, 1, 2, -3}, kInfinity},
        {"Gauss_2011", {1, 1, 2, 3}, kNaN},
        {"Kummer", {kNaN, 1, 2}, kNaN},
        {"Kummer", {0, kNaN, 2}, kNaN},
        {"Kummer", {0, 0, kNaN}, kNaN},
        {"Kummer", {1, kInfinity, kInfinity}, std::exp(1.0)},
        {"Kummer", {-kInfinity, kInfinity, -kInfinity}, 0},
        {"Kummer", {kInfinity, kInfinity, 2}, kNaN},
        {"Kummer", {-kInfinity, -kInfinity, 2}, kNaN},
        {"Kummer", {3, kInfinity, 2}, kNaN},
        {"Kummer", {3, 0, kInfinity}, 1},
        {"Kummer", {kInfinity, 0, -kInfinity}, 1},
        {"Kummer", {3, 2, kInfinity}, 1},
        {"Kummer", {kInfinity, 2, 3}, kInfinity},
        {"Kummer", {kInfinity, -2.5, 3}, kInfinity}, // kept, though the limit is -infinity
        {"Kummer", {kInfinity, 0, 3}, 1},
        {"Kummer", {-kInfinity, 2, 3.5}, 0},
        {"Kummer", {0, 2, 3}, 1},
        {"Kummer", {0, kInfinity, 3}, 1},
        {"Kummer", {2, 0, -3}, 1},
        {"Kummer", {2, 1.5, 1.5}, std::exp(2.0)},
        {"Kummer", {2, -3, -3}, std::exp(2.0)},
        {"Kummer", {2, 1, -3}, kNaN},
        {"Kummer", {-2, -5, -3}, kNaN},
        {"Kummer", {800, 1, 2.5}, kInfinity},
        {"Kummer", {800, -1.5, 2.5}, kInfinity}, // gamma(-1.5) > 0
        {"Kummer", {800, -0.5, 2.5}, -kInfinity},
        {"Tricomi", {-1, 1, 2}, kNaN},
        {"Tricomi", {kInfinity, 1, 2}, kNaN},
        {"Tricomi", {1, kNaN, 2}, kNaN},
        {"Tricomi", {1, 1, -kInfinity}, kNaN},
        {"Tricomi", {0, 1, 2}, kInfinity},
        {"Tricomi", {0, 1, 0.5}, kInfinity}, // kept, though the limit is finite
        {"Tricomi", {8, 0, 2.5}, 1},
        {"Tricomi", {8, 1.5, 2.5}, std::pow(8, -1.5)},
        {"Gauss_2026", {kNaN, 1, 2, 3}, kNaN},
        {"Gauss_2026", {-kInfinity, 1, 2, 3}, kNaN},
        {"Gauss_2026", {0.5, 1, kInfinity, 3}, kNaN},
        {"Gauss_2026", {1.0000001, 1, 2, 3}, kNaN},
        {"Gauss_2026", {1, 1, 2, 3}, kNaN},
        {"Gauss_2026", {1, -2, 2, -0.5}, -15}, // a terminating sum has its value there
        {"Gauss_2026", {-1e300, 0, 2, 3}, 1},
        {"Gauss_2026", {-1e300, 0.5, 2, 3}, kNaN}, // beyond 1e280
        {"Gauss_2026", {0.5, 1, 2, -3}, kInfinity},
        {"Gauss_2026", {-1, -3, 2, -3}, kInfinity},
        {"Gauss_2026", {-1, -2, 1, -3}, 1 - 2.0 / 3 + 1.0 / 3},
        {"Gauss_2026", {0.5, 2, 3, 3}, 4},
        {"Kummer_2026", {kNaN, 1, 2}, kNaN},
        {"Kummer_2026", {1, kInfinity, kInfinity}, kNaN},
        {"Kummer_2026", {kInfinity, 2, 3}, kInfinity},
        {"Kummer_2026", {kInfinity, -0.5, 3}, -kInfinity},
        {"Kummer_2026", {kInfinity, -3, 2.5}, -kInfinity},
        {"Kummer_2026", {-kInfinity, 2, 3.5}, 0},
        {"Kummer_2026", {-kInfinity, -1.5, 3.5}, kInfinity},
        {"Kummer_2026", {2, 1, -3}, kNaN},
        {"Kummer_2026", {2, -1, -4}, 1.5},
        {"Kummer_2026", {2, 1.5, 1.5}, std::exp(2.0)},
        {"Kummer_2026", {800, -0.5, 2.5}, -kInfinity},
        {"Kummer_2026", {-1e5, 2e5, 1.5}, kNaN}, // the sum would take too long
        {"Tricomi_2026", {-1, 1, 2}, kNaN},
        {"Tricomi_2026", {1, 1, -kInfinity}, kNaN},
        {"Tricomi_2026", {0, 1, 2}, kInfinity},
        {"Tricomi_2026", {0, -0.5, 2}, -kInfinity},
        {"Tricomi_2026", {0, -3, 2}, -24},
        {"Tricomi_2026", {0, 1, -1}, 0.5},
        {"Tricomi_2026", {8, 0, 2.5}, 1},
    };
    for (const auto &rule : rules)
        ExpectRule(Exports(), rule);
}

TEST(SpecialHypergeometric, TheVariantsOfGaussDifferOnlyBetweenTheirThresholds) {
    for (const double x : {-0.9, -0.51, 0.2, 0.6, 0.99})
        EXPECT_EQ(Value("Gauss", x, 0.7, 1.3, 2.25), Value("Gauss_2011", x, 0.7, 1.3, 2.25)) << x;
    int different = 0;
    for (double x = -0.5; x < 0.2; x += 0.01) {
        const double elder = Value("Gauss", x, 0.7, 1.3, 2.25);
        const double later = Value("Gauss_2011", x, 0.7, 1.3, 2.25);
        EXPECT_NEAR(elder, later, 1e-14 * later) << x;
        different += elder != later ? 1 : 0;
    }
    EXPECT_GT(different, 5);
}

TEST(SpecialHypergeometric, ParametersCountAsIntegersWithinTheTolerance) {
    // With c = -4, only a series that terminates by then has a value.
    EXPECT_NEAR(Value("Gauss", 0.5, -3 + 1e-11, 2.5, -4), Value("Gauss", 0.5, -3, 2.5, -4), 1e-13);
    EXPECT_EQ(Value("Gauss", 0.5, -3 + 3e-11, 2.5, -4), kInfinity);
    EXPECT_EQ(Value("Gauss", 0.5, 0.5, 2.5, -4 + 1e-11), kInfinity);
    EXPECT_LT(Value("Gauss", 0.5, 0.5, 2.5, -4 + 3e-11), kInfinity);
    EXPECT_EQ(Value("Gauss", 0.5, 2.5, 3, 3 + 1e-11), std::pow(0.5, -2.5));
    EXPECT_NE(Value("Gauss", 0.5, 2.5, 3, 3 + 3e-11), std::pow(0.5, -2.5));
}

TEST(SpecialHypergeometric, ContiguousFunctionsAndWronskiansHold) {
    for (const double x : {-0.7, -0.3, 0.15, 0.45, 0.8}) {
        const double a = 0.6, b = 1.35, c = 2.2; // (c-a) F(a-1) + (2a-c+(b-a)x) F = a (1-x) F(a+1)
        for (const char *name : {"Gauss", "Gauss_2011"})
            EXPECT_NEAR((c - a) * Value(name, x, a - 1, b, c) +
                            (2 * a - c + (b - a) * x) * Value(name, x, a, b, c),
                        a * (1 - x) * Value(name, x, a + 1, b, c), 1e-11)
                << name << ' ' << x;
    }
    for (const double x : {-60.0, -7.0, 0.3, 4.0, 25.0}) {
        const double a = 1.4, b = 2.3; // (b - a) M(a - 1) + (2a - b + x) M = a M(a + 1)
        const double right = a * Value("Kummer", x, a + 1, b);
        const double left =
            (b - a) * Value("Kummer", x, a - 1, b) + (2 * a - b + x) * Value("Kummer", x, a, b);
        EXPECT_NEAR(left, right, 1e-9 * std::fabs((b - a) * Value("Kummer", x, a - 1, b))) << x;
    }
    // M U' - M' U = -gamma(b) / gamma(a) x^(-b) exp(x), M' = a/b M(a+1, b+1), U' = -a U(a+1, b+1)
    for (const double x : {0.2, 2.0, 5.0, 9.0, 20.0}) {
        const double a = 0.4, b = 0.7;
        const double wronskian =
            -a * Value("Kummer", x, a, b) * Value("Tricomi", x, a + 1, b + 1) -
            a / b * Value("Kummer", x, a + 1, b + 1) * Value("Tricomi", x, a, b);
        const double expected = -std::tgamma(b) / std::tgamma(a) * std::pow(x, -b) * std::exp(x);
        EXPECT_NEAR(wronskian / expected, 1, x > 6 && x < 15 ? 1e-4 : 1e-8) << x;
    }
}

TEST(SpecialHypergeometric, TricomiAtAnIntegerIsTheMeanBesideIt) {
    for (const double b : {-3.0, 0.0, 1.0, 2.00009, 4.99991}) {
        const double mean =
            0.5 * (Value("Tricomi", 1.5, 0.7, b - 0.0005) + Value("Tricomi", 1.5, 0.7, b + 0.0005));
        EXPECT_EQ(Value("Tricomi", 1.5, 0.7, b), mean) << b;
    }
    const double beside = 0.5 * (Value("Tricomi", 1.5, 0.7, 2.00011 - 0.0005) +
                                 Value("Tricomi", 1.5, 0.7, 2.00011 + 0.0005));
    EXPECT_NE(Value("Tricomi", 1.5, 0.7, 2.00011), beside);
}

// Each method on its own, on arguments for which it is valid: its value, and an error estimate that
// covers the error.
TEST(SpecialHypergeometric, MethodsOfKummerEstimateTheirError) {
    typedef qx::KummerEstimate (*Method)(double, double, double);
    struct Case {
        Method method;
        double a, b, x;
        double expected; // mpmath at 30 digits
    };
    const Case cases[] = {
        {qx::KummerBessel, -1.3, 2.2, 1.7, 0.08429675511524970},
        {qx::KummerBessel, 2.3, 1.1, -13, 0.0009007924613400791},
        {qx::KummerBessel, -30, 5.5, 20, -0.01429232817876630},
        {qx::KummerSeries, 2.3, -1.1, -3, -3.998472692684525},
        {qx::KummerSeries, 12.3, -11.3, -3, 75.19962406673630},
        {qx::KummerAsymptotic, 2.3, 1.1, -60, 1.7427123382991406e-5},
        {qx::KummerAsymptotic, -1.6, 0.9, -35, 253.87662577154988},
        {qx::KummerBessel, 3.22, 2.31, -57.6, -2.4165643535895202e-7}, // ten digits cancel
        {qx::KummerAsymptotic, 0.75, 2.5, 300, 9.758236105587669e125},
        {qx::KummerAsymptotic, -3, 2, 30, -719}, // only the smaller part is left
        {qx::KummerAsymptotic, 4.5, 1.5, -30, -1.3064578467782147e-10},
    };
    for (const Case &c : cases) {
        const qx::KummerEstimate estimate = c.method(c.a, c.b, c.x);
        EXPECT_LE(std::fabs(estimate.value / c.expected - 1), estimate.error + 1e-13) << c.x;
        EXPECT_LT(estimate.error, qx::kHyperTolerance) << c.x;
    }
    for (const double a : {2.0, -2.0}) { // refuses b = 2 a and equal signs
        EXPECT_GT(qx::KummerBessel(a, 2 * a, -a).error, 1e30);
        EXPECT_GT(qx::KummerBessel(a, 2.5 * a, 0.5 * a).error, 1e30);
        EXPECT_GT(qx::KummerBessel(a, 2.5 * a, -a).error, 1e30); // (2 b - 4 a) x < 0
    }
}

TEST(SpecialHypergeometric, SeriesContinuesPastPolesAndEndsAtItsLimit) {
    // The terms fall below 1e-14 before the pole at k = 50 and rise to 1e25 after it.
    EXPECT_NEAR(qx::HyperSeries(1.3, 2.2, -50.5, 0.7), -1.133103668314078e25, 1e12);
    EXPECT_TRUE(std::isnan(qx::HyperSeries(1, 1, 1.5, 1 - 1e-9)));
    EXPECT_TRUE(std::isnan(Value("Gauss", -0.9999999, -1e12, 1, 1e12)));
    EXPECT_TRUE(std::isnan(qx::HyperSeries(1, 1, 2, 1)));
    EXPECT_TRUE(std::isnan(qx::HyperSeries(1, 1, 2, 1.5)));
}

// The relation of three contiguous functions in a, at random parameters up to 100; the error is
// relative to the largest of the three terms.
TEST(SpecialHypergeometric, RevisionsSatisfyTheContiguousRelation) {
    std::mt19937 generator(1);
    const auto uniform = [&](double low, double high) {
        return low + (high - low) * (generator() / 4294967296.0);
    };
    const auto expect = [](double first, double second, double third, const std::string &name) {
        const double largest =
            std::fmax(std::fabs(first), std::fmax(std::fabs(second), std::fabs(third)));
        if (!(largest < 1e-280 || largest > 1e300)) {
            EXPECT_LE(std::fabs(first + second + third), 4e-13 * largest) << name;
        }
    };
    for (int i = 0; i < 1000; ++i) {
        const double a = uniform(-100, 100), b = uniform(-100, 100), c = uniform(-100, 100);
        const double x = i % 2 == 0 ? uniform(-100, 100) : uniform(-3, 3);
        const double y = std::fabs(x), z = i % 2 == 0 ? uniform(-100, 1) : uniform(-1, 1);
        const std::string at = Text({a, b, c, x}) + Text({z});
        const auto m = [&](double to) { return Value("Kummer_2026", x, to, b); };
        expect((b - a) * m(a - 1), (2 * a - b + x) * m(a), -a * m(a + 1), "Kummer" + at);
        const auto u = [&](double to) { return Value("Tricomi_2026", y, to, b); };
        expect(u(a - 1), (b - 2 * a - y) * u(a), a * (a - b + 1) * u(a + 1), "Tricomi" + at);
        const auto f = [&](double to) { return Value("Gauss_2026", z, to, b, c); };
        expect((c - a) * f(a - 1), (2 * a - c + (b - a) * z) * f(a), -a * (1 - z) * f(a + 1),
               "Gauss" + at);
    }
}

// The Legendre polynomial of degree 200, whose terms reach 1e98, compared with its recurrence, and
// the Laguerre polynomial of degree 150 at 200, whose terms reach 2^374, with exact fractions.
TEST(SpecialHypergeometric, IntegerSumsSurviveTheCancellationOfHundredsOfDigits) {
    EXPECT_EQ(Value("Gauss_2026", 1, -200, 201, 1), 1);
    double before = 1, legendre = 0.25;
    for (int n = 1; n < 200; ++n) {
        const double next = ((2 * n + 1) * 0.25 * legendre - n * before) / (n + 1);
        before = legendre;
        legendre = next;
    }
    EXPECT_NEAR(Value("Gauss_2026", 0.375, -200, 201, 1), legendre, 1e-14);
    EXPECT_NEAR(Value("Kummer_2026", 200, -150, 1) / 8.58892438101663021e41, 1, 1e-15);
    const qx::HyperTerms terms = {{-150, 0}, {1, 0}, {1, 0}, {200, 0}, false};
    EXPECT_GT(qx::IntegerSum(terms, 374, 128).error, 1);           // too few digits are detected
    EXPECT_TRUE(std::isnan(qx::IntegerSum(terms, 10, 400).error)); // as is a wrong largest term
}

// On both sides of the ends of each region of U, compared with mpmath at 50 digits.
TEST(SpecialHypergeometric, TricomiAgreesWithReferencesInEachRegion) {
    const double rows[][4] = {
        // a, b, x, U(a, b, x)
        {0.7, 0.3, 0.14, 1.0536794496122942159},       {0.7, 0.3, 0.5, 0.77539023918354901087},
        {0.7, 0.3, 0.98, 0.61278498149977416266},      {0.7, 0.3, 1.02, 0.60321854250787191217},
        {0.7, 0.3, 5.5, 0.26255070339144337495},       {0.7, 0.3, 24.5, 0.1026118423408963392},
        {0.7, 0.3, 25.5, 0.099918211522277715463},     {0.7, 0.3, 45, 0.068170974059788256001},
        {2.75, 0.3, 0.14, 0.17469740182375718614},     {2.75, 0.3, 0.5, 0.076784405636456485487},
        {2.75, 0.3, 0.98, 0.039721266959050588018},    {2.75, 0.3, 1.02, 0.037971757255448205752},
        {2.75, 0.3, 5.5, 0.002912156265369683379},     {2.75, 0.3, 24.5, 0.00010752285833570087864},
        {2.75, 0.3, 25.5, 0.000097481616154145730105}, {2.75, 0.3, 45, 0.000023364277497791538106},
        {1.5, 2, 0.14, 6.8927786949604254695},         {1.5, 2, 0.5, 1.5977525948704763551},
        {1.5, 2, 0.98, 0.69850262511325400372},        {1.5, 2, 1.02, 0.66409138691304868667},
        {1.5, 2, 5.5, 0.069399683133415284748},        {1.5, 2, 24.5, 0.0080110384307832904986},
        {1.5, 2, 25.5, 0.0075525787452798586111},      {1.5, 2, 45, 0.0032596448977216616966},
        {0.3, 2, 0.14, 3.6487863116899615324},         {0.3, 2, 0.5, 1.6577084896687011956},
        {0.3, 2, 0.98, 1.1966120111626011282},         {0.3, 2, 1.02, 1.1755751717737865368},
        {0.3, 2, 5.5, 0.62183690440450649648},         {0.3, 2, 24.5, 0.38630343523688087339},
        {0.3, 2, 25.5, 0.38156954456649091527},        {0.3, 2, 45, 0.32066361432142642346},
        {0.4, 3.5, 0.14, 100.38676559406538749},       {0.4, 3.5, 0.5, 7.2384164906976267939},
        {0.4, 3.5, 0.98, 2.5873531321710828394},       {0.4, 3.5, 1.02, 2.4578710980534494294},
        {0.4, 3.5, 5.5, 0.59383502844720344669},       {0.4, 3.5, 24.5, 0.2880233856107691181},
        {0.4, 3.5, 25.5, 0.28306019687562189683},      {0.4, 3.5, 45, 0.22227134695417682746},
        {4.25, -1, 0.14, 0.0035656998260230699037},    {4.25, -1, 0.5, 0.0017922136084368027725},
        {4.25, -1, 0.98, 0.00093634880348528318922},   {4.25, -1, 1.02, 0.0008936283291090046122},
        {4.25, -1, 5.5, 0.000044571191187072291061},   {4.25, -1, 24.5, 5.0798155729217025346e-7},
        {4.25, -1, 25.5, 4.4158975348338020076e-7},    {4.25, -1, 45, 5.5540170642544091273e-8},
        {3, -2.25, 0.14, 0.011637879768194049925},     {3, -2.25, 0.5, 0.0081889786641106542043},
        {3, -2.25, 0.98, 0.0056423317698443201173},    {3, -2.25, 1.02, 0.0054874946991720813594},
        {3, -2.25, 5.5, 0.00079045161425808726869},    {3, -2.25, 24.5, 0.000035681300089636678658},
        {3, -2.25, 25.5, 0.000032342733537360838466},  {3, -2.25, 45, 7.5301353388897172485e-6},
    };
    for (const auto &[a, b, x, expected] : rows)
        EXPECT_NEAR(Value("Tricomi_2026", x, a, b) / expected, 1, 4e-14)
            << a << ' ' << b << ' ' << x;
}

TEST(SpecialHypergeometric, ReturnsSoonForAnyArgument) {
    // Most bit patterns lie outside [-1, 1], so additional forms map x into it, and close to 1.
    ExportMap exports = Exports();
    exports["Gauss"] = [](In a, double *o) { QX_Gauss(std::fmod(a[0], 1.0), a[1], a[2], a[3], o); };
    exports["GaussNear1"] = [](In a, double *o) {
        QX_Gauss(std::copysign(1 - std::exp2(-std::fabs(a[0])), a[0]), a[1], a[2], a[3], o);
    };
    exports["Gauss_2026Near1"] = [](In a, double *o) {
        QX_Gauss_2026(1 - std::exp2(-std::fabs(a[0])), a[1], a[2], a[3], o);
    };
    exports["Gauss_2026Small"] = [](In a, double *o) {
        QX_Gauss_2026(std::fmod(a[0], 1.0), a[1], a[2], a[3], o);
    };
    ExpectSoon(exports, 300000);
}

TEST(SpecialHypergeometric, LeavesNoStepAtAThreshold) {
    const Seam seams[] = {
        {"Gauss", {-0.5, 0.7, 1.3, 2.25}, 0, 1e-14},
        {"Gauss", {0.2, 0.7, 1.3, 2.25}, 0, 1e-13},
        {"Gauss_2011", {0.2, 0.7, 1.3, 2.25}, 0, 1e-13},
        {"Kummer", {-50, 1.5, 6.25}, 0, 1e-11},
        {"Tricomi", {6, 0.4, 0.7}, 0, 1e-6},
        {"Tricomi", {1.5, 0.4, 1.0001}, 2, 1e-5},
        {"Gauss_2026", {0.9, 0.7, 1.3, 2.25}, 0, 4e-15},
        {"Gauss_2026", {-9, 0.7, 1.3, 2.25}, 0, 4e-15},
        {"Gauss_2026", {0.95, 0.5, 1.25, 2.75}, 3, 4e-15},
        {"Kummer_2026", {30, 1.5, 6.25}, 0, 3e-14},
        {"Kummer_2026", {-30, 1.5, 6.25}, 0, 3e-14},
        {"Tricomi_2026", {1, 0.4, 0.7}, 0, 4e-15},
        {"Tricomi_2026", {1.5, 0.4, 1}, 2, 4e-15},
    };
    for (const auto &seam : seams)
        ExpectNoStep(Exports(), seam);
}

} // namespace
} // namespace qx::test
