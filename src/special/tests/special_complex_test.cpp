#include "qx/special_complex.h"

#include "frame/complex.h"
#include "frame/constants.h"
#include "special/tests/exports.h"
#include "tests/support/recipe.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace qx::test {
namespace {

using qx::operator+;
using qx::operator-;
using qx::operator*;
using qx::operator/;

typedef ErrorCode (*Bessel)(double, const CDB *, int32_t, CDB *);
typedef ErrorCode (*Airy)(const CDB *, int32_t, CDB *);

struct NamedBessel {
    const char *name;
    Bessel function;
};
struct NamedAiry {
    const char *name;
    Airy function;
};
constexpr NamedBessel kBessel[] = {{"BesselJ", QX_CxBesselJr},   {"BesselY", QX_CxBesselYr},
                                   {"BesselI", QX_CxBesselIr},   {"BesselK", QX_CxBesselKr},
                                   {"BesselH1", QX_CxBesselH1r}, {"BesselH2", QX_CxBesselH2r}};
constexpr NamedAiry kAiry[] = {{"AiryAi", QX_CxAiryAi},
                               {"AiryAiP", QX_CxAiryAiP},
                               {"AiryBi", QX_CxAiryBi},
                               {"AiryBiP", QX_CxAiryBiP}};

// The arguments are order, real part, imaginary part and scaling; the outputs are the real and the
// imaginary part and the code.
const qx::test::ExportMap &Exports() {
    static const qx::test::ExportMap exports = [] {
        qx::test::ExportMap map;
        for (const NamedBessel &bessel : kBessel)
            map[bessel.name] = [&bessel](const qx::test::Arguments &a, double *o) {
                const CDB z = {a[1], a[2]};
                CDB result;
                o[2] = bessel.function(a[0], &z, a[3] != 0, &result);
                o[0] = result.re;
                o[1] = result.im;
            };
        for (const NamedAiry &airy : kAiry)
            map[airy.name] = [&airy](const qx::test::Arguments &a, double *o) {
                const CDB z = {a[1], a[2]};
                CDB result;
                o[2] = airy.function(&z, a[3] != 0, &result);
                o[0] = result.re;
                o[1] = result.im;
            };
        return map;
    }();
    return exports;
}

struct Found {
    CDB value;
    ErrorCode code;
};
Found Call(const std::string &name, double order, CDB z, bool scaled = false) {
    double out[4] = {};
    Exports().at(name)({order, z.re, z.im, scaled ? 1.0 : 0.0}, out);
    return {{out[0], out[1]}, static_cast<ErrorCode>(out[2])};
}
double Size(CDB z) { return std::hypot(z.re, z.im); }

TEST(SpecialComplex, AgreesWithReferencesOnBothSidesOfEachThreshold) {
    EXPECT_GT(qx::test::ExpectAgreement(Exports(), qx::test::TestData("special_complex.dat")),
              1850);
}

TEST(SpecialComplex, ReportsWhatCannotBeComputed) {
    const struct {
        const char *name;
        double order;
        CDB z;
        ErrorCode code;
    } rules[] = {
        {"BesselJ", kNaN, {1, 1}, ErrBesselStatusOne},
        {"BesselJ", 1, {kInfinity, 1}, ErrBesselStatusOne},
        {"BesselI", 1, {1, kNaN}, ErrBesselStatusOne},
        {"BesselJ", -0.5, {0, 0}, ErrBesselStatusOne},
        {"BesselI", -2.5, {0, -0.0}, ErrBesselStatusOne},
        {"BesselY", 0, {0, 0}, ErrBesselStatusOne},
        {"BesselK", 2, {-0.0, 0}, ErrBesselStatusOne},
        {"BesselH1", 0.5, {0, 0}, ErrBesselStatusOne},
        {"BesselH2", 0.5, {0, 0}, ErrBesselStatusOne},
        {"AiryAi", 0, {kNaN, 0}, ErrBesselStatusOne},
        {"AiryBiP", 0, {0, -kInfinity}, ErrBesselStatusOne},
        {"BesselJ", 1, {3e9, 0}, ErrBesselStatusFour},
        {"BesselK", -3e9, {1, 0}, ErrBesselStatusFour},
        {"AiryAi", 0, {0, 3e6}, ErrBesselStatusFour},
        {"BesselJ", 1, {1, 800}, ErrOverflow},
        {"BesselI", 1, {-800, 2}, ErrOverflow},
        {"BesselK", 200, {1e-3, 1e-3}, ErrOverflow},
        {"BesselK", 9.5, {1e-100, 0}, ErrOverflow},
        {"BesselY", -30.25, {1e-60, 0}, ErrOverflow},
        {"BesselH1", 3, {4, -900}, ErrOverflow},
        {"BesselH2", 3, {4, 900}, ErrOverflow},
        {"AiryBi", 0, {110, 1}, ErrOverflow},
        {"AiryAiP", 0, {-60, 200}, ErrOverflow},
        {"BesselJ", 1, {5e7, 0}, WarnLowAccuracy},
        {"BesselI", -6e7, {0, 6e7}, WarnLowAccuracy},
        {"AiryBi", 0, {-2e5, 0}, WarnLowAccuracy},
    };
    for (const auto &rule : rules) {
        const Found found = Call(rule.name, rule.order, rule.z);
        EXPECT_EQ(found.code, rule.code) << rule.name << ' ' << rule.order;
        EXPECT_EQ(std::isnan(found.value.re) && std::isnan(found.value.im), rule.code < 0)
            << rule.name << ' ' << rule.order;
    }
}

TEST(SpecialComplex, HasTheValuesAtZeroAndUnderflowsToZero) {
    for (const char *name : {"BesselJ", "BesselI"}) {
        EXPECT_EQ(Call(name, 0, {0, 0}).value.re, 1);
        EXPECT_EQ(Call(name, -3, {0, 0}).value.re, 0);
        EXPECT_EQ(Call(name, 2.5, {0, 0}).value.re, 0);
    }
    for (const Found &found :
         {Call("BesselK", 1, {800, 5}), Call("BesselH1", 2, {3, 900}), Call("AiryAi", 0, {120, 1}),
          Call("BesselJ", 300, {1e-3, 1e-3}), Call("BesselJ", -40, {1e-20, 1e-30})}) {
        EXPECT_EQ(found.code, 0);
        EXPECT_EQ(Size(found.value), 0);
    }
}

TEST(SpecialComplex, MirrorsAtTheRealAxisAndTakesTheSideOfTheCutFromTheSignOfZero) {
    const double heights[] = {0.0, 1e-9, 0.3, 4, 40};
    for (const double order : {0.0, 0.5, -3.25, 12.0, 70.5})
        for (const double x : {-75.0, -9.0, -0.4, 0.7, 11.0, 71.0})
            for (const double y : heights) {
                const CDB above = {x, y};
                const CDB below = {x, -y};
                for (const NamedBessel &bessel : kBessel) {
                    std::string other = bessel.name;
                    if (other == "BesselH1")
                        other = "BesselH2";
                    else if (other == "BesselH2")
                        other = "BesselH1";
                    const CDB a = Call(bessel.name, order, above).value;
                    const CDB b = Call(other, order, below).value;
                    EXPECT_EQ(a.re, b.re) << bessel.name << order << ' ' << x << ' ' << y;
                    EXPECT_EQ(a.im, -b.im) << bessel.name << order << ' ' << x << ' ' << y;
                }
            }
    EXPECT_GT(Call("BesselK", 0, {-2, -0.0}).value.im, 6); // K_0(2) and pi I_0(2)
    EXPECT_LT(Call("BesselK", 0, {-2, 0.0}).value.im, -6);
    EXPECT_LT(Call("AiryAi", 0, {-2, 0.0}, true).value.im, -0.2); // exp(zeta) turns Ai(-2)
    EXPECT_GT(Call("AiryAi", 0, {-2, -0.0}, true).value.im, 0.2);
}

TEST(SpecialComplex, IsRealWhereItShouldBe) {
    for (const double x : {1e-3, 0.9, 2.0, 17.0, 23.5, 300.0})
        for (const double order : {0.0, 1.5, -2.75, 20.0, -150.0})
            for (const char *name : {"BesselJ", "BesselY", "BesselI", "BesselK"}) {
                const Found found = Call(name, order, {x, 0}, true);
                EXPECT_TRUE(found.code != 0 || found.value.im == 0) << name << order << ' ' << x;
            }
    for (const NamedAiry &airy : kAiry)
        for (const double x : {-40.0, -1.0, 0.0, 1.2, 30.0})
            EXPECT_EQ(Call(airy.name, 0, {x, -0.0}).value.im, 0) << airy.name << x;
}

// I_v K_(v+1) + I_(v+1) K_v = 1 / z and Ai Bi' - Ai' Bi = 1 / pi hold everywhere; the functions are
// scaled in the right half-plane, so that nothing overflows or underflows.
TEST(SpecialComplex, KeepsTheWronskians) {
    qx::test::Noise noise(7);
    for (int i = 0; i < 4000; ++i) {
        const double modulus = std::exp2(13 * noise.positive() - 3);
        // whole, half and other orders to which 1 can be added exactly, a third of them near the
        // modulus
        const double any = std::exp2(12 * noise.positive() - 2) + (i % 3 == 0 ? modulus : 0);
        const double order = std::ldexp(std::floor(std::ldexp(any, i % 20)), -(i % 20));
        const double angle = 0.5 * kPi * noise.symmetric();
        const CDB z = {modulus * std::cos(angle), modulus * std::sin(angle)};
        const Found i0 = Call("BesselI", order, z, true);
        const Found i1 = Call("BesselI", order + 1, z, true);
        const Found k0 = Call("BesselK", order, z, true);
        const Found k1 = Call("BesselK", order + 1, z, true);
        if (k1.code != 0 || Size(i1.value) < 1e-290)
            continue;
        const CDB first = i0.value * k1.value;
        const CDB second = i1.value * k0.value;
        // exp(z) of K times exp(-Re z) of I
        const CDB turn = {std::cos(z.im), std::sin(z.im)};
        const CDB rest = first + second - turn / z;
        EXPECT_LE(Size(rest), 6e-15 * (Size(first) + Size(second)))
            << order << ' ' << z.re << ' ' << z.im;
    }
    for (int i = 0; i < 1000; ++i) {
        const double modulus = std::exp2(8 * noise.positive() - 3);
        const double angle = kPi * noise.symmetric();
        const CDB z = {modulus * std::cos(angle), modulus * std::sin(angle)};
        const CDB first = Call("AiryAi", 0, z).value * Call("AiryBiP", 0, z).value;
        const CDB second = Call("AiryAiP", 0, z).value * Call("AiryBi", 0, z).value;
        if (!std::isfinite(first.re + first.im + second.re + second.im))
            continue;
        const CDB rest = first - second + -1 / kPi;
        EXPECT_LE(Size(rest), 1e-14 * (1 + std::pow(modulus, 1.5)) * (Size(first) + Size(second)))
            << z.re << ' ' << z.im;
    }
}

// Functions of half orders are elementary; the exponent keeps its digits for arguments of any size.
TEST(SpecialComplex, KeepsItsDigitsForLargeArguments) {
    for (const double x : {1e3, 123456.5, 4e7, 1e9}) {
        const double amplitude = std::sqrt(2 / (kPi * x));
        EXPECT_NEAR(Call("BesselJ", 0.5, {x, 0}).value.re, amplitude * std::sin(x),
                    1e-15 * amplitude);
        EXPECT_NEAR(Call("BesselY", 0.5, {x, 0}).value.re, -amplitude * std::cos(x),
                    1e-15 * amplitude);
        const CDB k = Call("BesselK", 0.5, {x, 3}, true).value;
        EXPECT_NEAR(k.re, std::sqrt(kPi / (2 * x)), 2 / (x * std::sqrt(x)));
    }
}

TEST(SpecialComplex, ReturnsSoonForAnyArgument) { qx::test::ExpectSoon(Exports(), 200000); }

} // namespace
} // namespace qx::test
