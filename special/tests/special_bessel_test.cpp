#include "qx/special_bessel.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <functional>
#include <limits>
#include <map>
#include <sstream>
#include <string>

namespace {

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
constexpr double kInfinity = std::numeric_limits<double>::infinity();

// Every export as a function of two numbers that fills up to four outputs.
typedef std::function<void(double, double, double *)> Export;

// An int32 from any double, as the fuzz test makes them.
int32_t Whole(double x) {
    if (!(std::fabs(x) < 2147483647.0))
        return x > 0 ? std::numeric_limits<int32_t>::max() : std::numeric_limits<int32_t>::min();
    return static_cast<int32_t>(x);
}

const std::map<std::string, Export> &Exports() {
    static const std::map<std::string, Export> exports = {
        {"Airy", [](double x, double, double *o) { QX_Airy(x, o, o + 1, o + 2, o + 3); }},
        {"BesselJr", [](double v, double x, double *o) { QX_BesselJr(v, x, o); }},
        {"BesselYr", [](double v, double x, double *o) { QX_BesselYr(v, x, o); }},
        {"BesselJs", [](double n, double x, double *o) { QX_BesselJs(Whole(n), x, o); }},
        {"BesselYs", [](double n, double x, double *o) { QX_BesselYs(Whole(n), x, o); }},
        {"BesselIr", [](double v, double x, double *o) { QX_BesselIr(v, x, o); }},
        {"BesselKn", [](double n, double x, double *o) { QX_BesselKn(Whole(n), x, o); }},
        {"KelvinI", [](double x, double n, double *o) { QX_KelvinI(x, Whole(n), o, o + 1); }},
        {"KelvinK", [](double x, double n, double *o) { QX_KelvinK(x, Whole(n), o, o + 1); }},
        {"Struve", [](double x, double v, double *o) { QX_Struve(x, v, o); }},
        {"ParabolicCylinder", [](double x, double v, double *o) { QX_ParabolicCylinder(x, v, o); }},
        {"Elliptic1", [](double m, double phi, double *o) { QX_Elliptic1(m, phi, o); }},
        {"Elliptic2", [](double m, double phi, double *o) { QX_Elliptic2(m, phi, o); }},
        {"EllipticJ",
         [](double u, double m, double *o) { QX_EllipticJ(u, m, o, o + 1, o + 2, o + 3); }},
        {"Dawson", [](double x, double, double *o) { QX_Dawson(x, o); }},
        {"FresnelIntegrals", [](double x, double, double *o) { QX_FresnelIntegrals(x, o, o + 1); }},
        {"Zeta", [](double x, double, double *o) { QX_Zeta(x, o); }},
    };
    return exports;
}

double Value(const char *name, double a, double b = 0, int output = 0) {
    double out[4] = {};
    Exports().at(name)(a, b, out);
    return out[output];
}

TEST(SpecialBessel, AgreesWithReferencesOnBothSidesOfEachThreshold) {
    std::ifstream file(QX_TEST_DATA "bessel.txt");
    std::string line;
    int count = 0;
    while (std::getline(file, line)) {
        std::istringstream in(line);
        std::string name, a, b, value, bound;
        int output = 0;
        in >> name >> a >> b >> output >> value >> bound; // strtod reads nan, streams do not
        const double expected = std::strtod(value.c_str(), nullptr);
        const double ours = Value(name.c_str(), std::strtod(a.c_str(), nullptr),
                                  std::strtod(b.c_str(), nullptr), output);
        EXPECT_LE(std::fabs(ours - expected), std::strtod(bound.c_str(), nullptr))
            << line << " ours " << ours;
        EXPECT_FALSE(std::isnan(ours)) << line;
        ++count;
    }
    EXPECT_GT(count, 1000);
}

struct Rule {
    const char *name;
    double a, b;
    double expected; // NaN for NaN
};

TEST(SpecialBessel, KeepsTheRulesOfDomainsAndLimits) {
    constexpr double largest = std::numeric_limits<double>::max();
    const Rule rules[] = {
        {"BesselJr", -200.5, 3, kNaN},
        {"BesselJr", 0.5, -1, kNaN},
        {"BesselJr", kNaN, 1, kNaN},
        {"BesselJr", 0.5, 1e-16, 0},
        {"BesselJr", 0, 0, 1},
        {"BesselJr", 3, 0, 0},
        {"BesselJr", 2.5, kInfinity, 0},
        {"BesselYr", 1.5, 0, kNaN},
        {"BesselYr", 1, -1, kNaN},
        {"BesselYr", -201, 5, kNaN},
        {"BesselJs", 0, 0, 1},
        {"BesselJs", 2, 0, 0},
        {"BesselJs", 2, -1, kNaN},
        {"BesselJs", 2, kInfinity, 0},
        {"BesselYs", 2, -1, kNaN},
        {"BesselYs", 2, 0, -kInfinity},
        {"BesselYs", 2, kInfinity, 0},
        {"BesselIr", -200.5, 1, kNaN},
        {"BesselIr", 0.5, -1, kNaN},
        {"BesselIr", 0.5, 0, 0},
        {"BesselIr", 0, 0, 1},
        {"BesselIr", -0.5, 0, kInfinity},
        {"BesselIr", -1.5, 0, -kInfinity},
        {"BesselKn", 1, -1, kNaN},
        {"BesselKn", 3, 0, kInfinity},
        {"BesselKn", 3, kInfinity, 0},
        {"KelvinK", 0, 1, kNaN},
        {"KelvinI", 0, 0, 1},
        {"Struve", 0, -1, kNaN},
        {"Struve", 0, 1, 0},
        {"Struve", -1, 0.5, kNaN},
        {"Struve", kInfinity, 1, kNaN},
        {"ParabolicCylinder", kInfinity, 2.5, 0},
        {"ParabolicCylinder", -kInfinity, 2, 0},
        {"ParabolicCylinder", -kInfinity, 0.5, -kInfinity},
        {"ParabolicCylinder", 1, kInfinity, kNaN},
        {"Elliptic1", -0.1, 1, kNaN},
        {"Elliptic1", 1.1, kNaN, kNaN},
        {"Elliptic1", 1, kNaN, kInfinity},
        {"Elliptic2", 1, kNaN, 1},
        {"Elliptic1", 0, 0.75, 0.75},
        {"Elliptic1", 0.5, 0, 0},
        {"EllipticJ", 1, 1.5, kNaN},
        {"Dawson", kInfinity, 0, kNaN},
        {"Dawson", kNaN, 0, kNaN},
        {"Dawson", -1e10, 0, -0.5e-10},
        {"FresnelIntegrals", -kInfinity, 0, -0.5},
        {"Zeta", kInfinity, 0, kInfinity},
        {"Zeta", 1, 0, kInfinity},
        {"Zeta", -kInfinity, 0, kNaN},
        {"Zeta", -30.82, 0, kNaN},
        {"Zeta", 127, 0, 1},
        {"Zeta", -4, 0, 0},
        {"Airy", 104, 0, 0},
        {"Airy", kNaN, 0, kNaN},
    };
    for (const Rule &rule : rules) {
        const double ours = Value(rule.name, rule.a, rule.b);
        if (std::isnan(rule.expected))
            EXPECT_TRUE(std::isnan(ours)) << rule.name << ' ' << rule.a << ' ' << rule.b;
        else
            EXPECT_EQ(ours, rule.expected) << rule.name << ' ' << rule.a << ' ' << rule.b;
    }
    EXPECT_EQ(Value("Airy", 104, 0, 1), 0);
    EXPECT_EQ(Value("Airy", 104, 0, 2), largest);
    EXPECT_EQ(Value("Airy", 104, 0, 3), largest);
}

TEST(SpecialBessel, FoldsSignsAndSelectsTheCompleteForms) {
    EXPECT_EQ(Value("BesselJr", -3, 2.2), -Value("BesselJr", 3, 2.2));
    EXPECT_EQ(Value("BesselJr", 3, -2.2), -Value("BesselJr", 3, 2.2));
    EXPECT_EQ(Value("BesselJr", -3, -2.2), Value("BesselJr", 3, 2.2));
    EXPECT_EQ(Value("BesselKn", -4, 2.2), Value("BesselKn", 4, 2.2));
    EXPECT_EQ(Value("KelvinI", 2.2, -3), -Value("KelvinI", 2.2, 3));
    EXPECT_EQ(Value("KelvinI", -2.2, 3), -Value("KelvinI", 2.2, 3));
    EXPECT_EQ(Value("Struve", -2.2, 1), Value("Struve", 2.2, 1));

    double complete = 0;
    QX_Elliptic1_85(0.3, 0.5, &complete, 1);
    EXPECT_EQ(complete, Value("Elliptic1", 0.3, kNaN));
    QX_Elliptic1_85(0.3, 0.5, &complete, 2); // anything but 1
    EXPECT_EQ(complete, Value("Elliptic1", 0.3, 0.5));
    QX_Elliptic2_85(0.3, 0.5, &complete, 1);
    EXPECT_EQ(complete, Value("Elliptic2", 0.3, kNaN));
    QX_Elliptic2_85(0.3, kNaN, &complete, 0); // here a NaN selects nothing
    EXPECT_TRUE(std::isnan(complete));

    double sn = 0;
    QX_EllipticJ(0.5, 0.3, &sn, nullptr, nullptr, nullptr);
    EXPECT_EQ(sn, Value("EllipticJ", 0.5, 0.3));
    // the amplitude inverts F, also past a quarter period
    EXPECT_NEAR(Value("Elliptic1", 0.3, Value("EllipticJ", 7.5, 0.3, 3)), 7.5, 1e-13);
}

// Arguments of every kind: random bit patterns, and numbers of ordinary size, which reach more of
// the methods. QX_FUZZ sets the count.
class Bits {
public:
    double next() {
        state_ = state_ * 6364136223846793005U + 1442695040888963407U;
        const uint64_t bits = state_ ^ (state_ >> 29);
        double x = 0;
        if (bits % 3 == 0) {
            std::memcpy(&x, &bits, sizeof x);
            return x;
        }
        x = std::exp2(static_cast<double>(bits >> 8 & 0xFFFFF) * 0x1p-20 * 40 - 20);
        const double rounded = bits % 2 != 0 ? std::rint(x) : x;
        return bits >> 40 & 1 ? -rounded : rounded;
    }

private:
    uint64_t state_ = 20240607;
};

TEST(SpecialBessel, ReturnsSoonForAnyArgument) {
    const char *wanted = std::getenv("QX_FUZZ");
    const int count = wanted != nullptr ? std::atoi(wanted) : 5000;
    // A single call may be interrupted by the system, so a slow one is repeated.
    const auto seconds = [](const Export &function, double a, double b) {
        double out[4];
        const auto start = std::chrono::steady_clock::now();
        function(a, b, out);
        return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    };
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    constexpr double limit = 20e-3;
#else
    constexpr double limit = 1e-3;
#endif
    for (const auto &[name, function] : Exports()) {
        Bits bits;
        for (int i = 0; i < count; ++i) {
            const double a = bits.next();
            const double b = bits.next();
            double time = seconds(function, a, b);
            for (int repeat = 0; repeat < 5 && time > limit; ++repeat)
                time = std::fmin(time, seconds(function, a, b));
            ASSERT_LE(time, limit) << name << ' ' << a << ' ' << b;
        }
    }
}

TEST(SpecialBessel, LeavesNoStepAtAThreshold) {
    struct Seam {
        const char *name;
        double a, b;
        bool second; // the threshold is in the second argument
        double tolerance;
    };
    const Seam seams[] = {
        {"Airy", -2.09, 0, false, 1e-14},
        {"Airy", 2.09, 0, false, 1e-13},
        {"BesselJr", 0, 8, true, 1e-13},
        {"BesselYr", 1, 8, true, 1e-13},
        {"BesselJr", 0.3, 12.9277, true, 1e-9},
        {"BesselIr", 2.5, 40, true, 1e-13},
        {"KelvinI", 5, 3, false, 1e-13},
        {"KelvinK", 2, 3, false, 1e-13},
        {"ParabolicCylinder", 1, -0.7, false, 1e-13},
        {"Elliptic1", 0.5, kNaN, false, 1e-14},
        {"Dawson", 3.25, 0, false, 1e-14},
        {"Dawson", 6.25, 0, false, 1e-14},
        {"FresnelIntegrals", 1.6, 0, false, 1e-14},
        {"FresnelIntegrals", 3, 0, false, 1e-14},
        {"Zeta", 10, 0, false, 1e-14},
        {"Zeta", 50, 0, false, 1e-15},
        {"Struve", 18, 1, false, 1e-12},
    };
    for (const Seam &seam : seams) {
        const double t = seam.second ? seam.b : seam.a;
        const double low = std::nextafter(t, -kInfinity);
        const double high = std::nextafter(t, kInfinity);
        const double below =
            seam.second ? Value(seam.name, seam.a, low) : Value(seam.name, low, seam.b);
        const double above =
            seam.second ? Value(seam.name, seam.a, high) : Value(seam.name, high, seam.b);
        EXPECT_NEAR(below, above, seam.tolerance * std::fabs(below) + 1e-15)
            << seam.name << ' ' << t;
    }
}

} // namespace
