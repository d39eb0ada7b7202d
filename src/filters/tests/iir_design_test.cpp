#include "qx/iir_design.h"

#include "filters/section_forms.h"
#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/table.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <limits>
#include <numbers>
#include <string>
#include <vector>

namespace qx::test {
namespace {

typedef std::complex<long double> Complex;

constexpr long double pi = std::numbers::pi_v<long double>;
constexpr double nan = std::numeric_limits<double>::quiet_NaN();

enum Family { BW, Chebyshev, InvChebyshev, Elliptic, Bessel };
const std::vector<std::string> familyNames = {"BW", "Chebyshev", "InvChebyshev", "Elliptic",
                                              "Bessel"};
enum Type : int32_t { Lowpass, Highpass, Bandpass, Bandstop };
constexpr int32_t plain = -1; // the export without a form

struct Design {
    int family;
    int32_t order, type;
    double fl = 0.1, fh = 0.23, ripple = 1.0, attenuation = 60.0, fs = 1.0;
    int32_t form = plain;
};

struct Cascade {
    std::vector<double> a, b;
    std::size_t order = 2; // of a section
    ErrorCode err = 99;

    std::size_t sections() const { return a.size() / order; }
    Complex section(std::size_t s, double frequency) const {
        const Complex z = std::polar(1.0L, -2 * pi * frequency);
        Complex above = 0.0L, below = 0.0L;
        for (std::size_t k = order + 1; k-- > 0;) {
            above = above * z + static_cast<long double>(b[(order + 1) * s + k]);
            below = below * z + static_cast<long double>(k == 0 ? 1.0 : a[order * s + k - 1]);
        }
        return above / below;
    }
    Complex at(double frequency) const {
        Complex h = 1.0L;
        for (std::size_t s = 0; s < sections(); ++s)
            h *= section(s, frequency);
        return h;
    }
    double gain(double frequency) const { return static_cast<double>(std::abs(at(frequency))); }
    double decibels(double frequency) const { return 20 * std::log10(gain(frequency)); }
};

int32_t Call(const Design &d, DBL1D a, DBL1D b, ErrorCode *err) {
    const double *fs = &d.fs, *fl = &d.fl, *fh = &d.fh, *rp = &d.ripple, *rs = &d.attenuation;
    const int32_t *n = &d.order, *t = &d.type, f = d.form;
    switch (d.family) {
    case BW:
        return f == plain ? BWCoefs(fs, fl, fh, n, t, a, b, err)
                          : BWCoefs90(fs, fl, fh, n, t, f, a, b, err);
    case Chebyshev:
        return f == plain ? ChebyshevCoefs(fs, fl, fh, rp, n, t, a, b, err)
                          : ChebyshevCoefs90(fs, fl, fh, rp, n, t, f, a, b, err);
    case InvChebyshev:
        return f == plain ? InvChebyshevCoefs(fs, fl, fh, rs, n, t, a, b, err)
                          : InvChebyshevCoefs90(fs, fl, fh, rs, n, t, f, a, b, err);
    case Elliptic:
        return f == plain ? EllipticCoefs(fs, fl, fh, rp, rs, n, t, a, b, err)
                          : EllipticCoefs90(fs, fl, fh, rp, rs, n, t, f, a, b, err);
    default:
        return f == plain ? BesselCoefs(fs, fl, fh, n, t, a, b, err)
                          : BesselCoefs90(fs, fl, fh, n, t, f, a, b, err);
    }
}

Cascade Designed(const Design &d) {
    const DBLArray a(std::vector<double>(3, 7.0)), b(std::vector<double>(3, 7.0));
    Cascade cascade;
    EXPECT_EQ(Call(d, a.handle(), b.handle(), &cascade.err), 0);
    cascade.a = a.values();
    cascade.b = b.values();
    cascade.order = (d.form == plain ? d.type >= Bandpass : d.form == 1) ? 4 : 2;
    EXPECT_EQ(cascade.b.size(), cascade.sections() * (cascade.order + 1));
    return cascade;
}

int FamilyOf(const std::string &name) {
    int family = 0;
    while (familyNames[static_cast<std::size_t>(family)] != name)
        ++family;
    return family;
}

// All forms; splitting a band filter into second-order sections costs some digits.
TEST(IIRDesign, AgreesWithSciPyInThePassBand) {
    ResetHost();
    for (const TableRow &row : ReadTable(TestData("iir_design.dat"))) {
        const auto &v = row.arguments;
        Design design = {FamilyOf(row.name),
                         static_cast<int32_t>(v[0]),
                         static_cast<int32_t>(v[1]),
                         v[2],
                         v[3],
                         v[4],
                         v[5]};
        for (const int32_t form : {plain, 0, 1}) {
            design.form = form;
            EXPECT_NEAR(Designed(design).decibels(v[6]), row.value, 1e-9) << row.text << form;
        }
    }
}

// The analog prototype frequency that corresponds to a frequency of the filter.
long double PrototypeFrequency(const Design &d, double frequency) {
    const long double at = std::tan(pi * frequency / d.fs), low = std::tan(pi * d.fl / d.fs),
                      high = std::tan(pi * d.fh / d.fs);
    const long double band = (at * at - low * high) / (at * (high - low));
    return d.type == Lowpass    ? at / low
           : d.type == Highpass ? low / at
           : d.type == Bandpass ? band
                                : 1 / band;
}

long double ChebyshevPolynomial(int32_t n, long double x) {
    x = std::fabs(x);
    return x <= 1 ? std::cos(n * std::acos(x)) : std::cosh(n * std::acosh(x));
}

double ClosedFormGain(const Design &d, double frequency) {
    const long double w = PrototypeFrequency(d, frequency);
    long double excess = std::pow(w, 2 * d.order);
    if (d.family == Chebyshev) {
        const long double T = ChebyshevPolynomial(d.order, w);
        excess = (std::pow(10.0L, d.ripple / 10) - 1) * T * T;
    } else if (d.family == InvChebyshev) {
        const long double T = ChebyshevPolynomial(d.order, 1 / w);
        excess = (std::pow(10.0L, d.attenuation / 10) - 1) / (T * T);
    }
    return static_cast<double>(1 / std::sqrt(1 + excess));
}

// Pass band and stop band, at a sampling rate other than 1, and for orders far beyond those in use.
TEST(IIRDesign, HasTheGainOfItsDefinition) {
    ResetHost();
    for (int family = BW; family <= InvChebyshev; ++family)
        for (int32_t type = Lowpass; type <= Bandstop; ++type)
            for (const int32_t order : {1, 2, 3, 7, 12, 25, 40}) {
                const Design design = {family, order, type, 9000, 15000, 0.5, 50, 48000};
                const Cascade cascade = Designed(design);
                ASSERT_EQ(cascade.err, 0);
                for (const double f : {100.0, 5000.0, 8800.0, 9000.0, 12000.0, 15000.0, 19000.0})
                    EXPECT_NEAR(cascade.gain(f / 48000), ClosedFormGain(design, f), 1e-9)
                        << familyNames[static_cast<std::size_t>(family)] << " " << type << " "
                        << order << " " << f;
            }
}

TEST(IIRDesign, EllipticFiltersHaveEqualRipplesInBothBands) {
    ResetHost();
    for (const int32_t order : {2, 3, 6, 9}) {
        const Cascade filter = Designed({Elliptic, order, Lowpass, 0.15, 0, 0.7, 48});
        const auto extremes = [&](double from, double to) {
            double least = 2, most = 0;
            for (int k = 0; k <= 2000; ++k) {
                const double gain = filter.gain(from + k / 2000.0 * (to - from));
                least = std::min(least, gain);
                most = std::max(most, gain);
            }
            return std::pair{20 * std::log10(least), 20 * std::log10(most)};
        };
        const auto [leastPassed, mostPassed] = extremes(0, 0.15);
        EXPECT_NEAR(leastPassed, -0.7, 1e-9);
        EXPECT_NEAR(mostPassed, 0.0, 1e-3);
        double passes = 0.15, stops = 0.35; // the edge of the stop band by bisection
        while (order > 2 && stops - passes > 1e-12) {
            const double middle = (passes + stops) / 2;
            (filter.decibels(middle) > -48 ? passes : stops) = middle;
        }
        EXPECT_NEAR(extremes(order > 2 ? stops : 0.45, 0.5).second, -48, 0.01) << order;
    }
}

TEST(IIRDesign, IsStableUpToOrder40) {
    ResetHost();
    for (int family = BW; family <= Bessel; ++family)
        for (int32_t type = Lowpass; type <= Bandstop; ++type)
            for (const int32_t order : {1, 2, 3, 4, 5, 8, 13, 20, 27, 34, 39, 40}) {
                Design design = {family, order, type};
                design.form = 0;
                const Cascade cascade = Designed(design);
                for (std::size_t s = 0; s < cascade.sections(); ++s) {
                    const double a0 = cascade.a[2 * s], a1 = cascade.a[2 * s + 1];
                    ASSERT_TRUE(std::fabs(a1) < 1 && std::fabs(a0) < 1 + a1)
                        << familyNames[static_cast<std::size_t>(family)] << type << " " << order;
                }
            }
}

TEST(IIRDesign, LaysOutItsSections) {
    ResetHost();
    // A real pole: (g (1 + z^-1) / (1 + g)) / (1 + (g - 1) / (g + 1) z^-1); the same for Bessel.
    for (const int family : {BW, Bessel}) {
        const Cascade one = Designed({family, 1, Lowpass});
        const double g = std::tan(static_cast<double>(pi) * 0.1);
        ASSERT_EQ(one.a.size(), 2U);
        EXPECT_NEAR(one.a[0], (g - 1) / (g + 1), 1e-15);
        EXPECT_NEAR(one.b[0], g / (1 + g), 1e-15);
        EXPECT_EQ(one.b[1], one.b[0]);
        EXPECT_TRUE(one.a[1] == 0 && one.b[2] == 0);
    }
    // The real pole comes first: alone, before products of pairs, and as a section beside a 1.
    Design odd = {BW, 5, Lowpass};
    odd.form = 1;
    const Cascade fourth = Designed(odd), second = Designed({BW, 5, Lowpass});
    ASSERT_EQ(fourth.a.size(), 8U);
    for (const std::size_t k : {1U, 2U, 3U})
        EXPECT_TRUE(fourth.a[k] == 0 && fourth.b[k + 1] == 0);
    EXPECT_EQ(fourth.a[0], second.a[0]);
    EXPECT_NEAR(fourth.a[4], second.a[2] + second.a[4], 1e-15);
    odd.type = Bandpass, odd.form = 0;
    const Cascade split = Designed(odd);
    ASSERT_EQ(split.a.size(), 12U);
    EXPECT_EQ(std::vector<double>(split.a.begin() + 2, split.a.begin() + 4),
              (std::vector<double>{0, 0}));
    EXPECT_EQ(std::vector<double>(split.b.begin() + 3, split.b.begin() + 6),
              (std::vector<double>{1, 0, 0}));
    // Sections requested in the form that they already have are not changed.
    for (int32_t type = Lowpass; type <= Bandstop; ++type)
        for (int family = BW; family <= Bessel; ++family) {
            Design design = {family, 6, type};
            const Cascade usual = Designed(design);
            design.form = type >= Bandpass;
            EXPECT_EQ(Designed(design).a, usual.a);
            EXPECT_EQ(Designed(design).b, usual.b);
        }
}

// 1 + c z^-1 + d z^-2.
struct Quadratic {
    double c, d;
};

void ExpectSplit(const Quadratic &p, const Quadratic &q) {
    const double a[4] = {p.c + q.c, p.d + q.d + p.c * q.c, p.c * q.d + q.c * p.d, p.d * q.d};
    const double b[5] = {2, 2 * (p.c + q.c), 2 * (2 + p.c * q.c), 2 * (p.c + q.c), 2};
    double A[4], B[6];
    ASSERT_EQ(qx::FourthToSecondOrder({{a, 4}, {b, 5}, 1}, {{A, 4}, {B, 6}}), 0);
    const double productA[4] = {A[0] + A[2], A[1] + A[3] + A[0] * A[2], A[0] * A[3] + A[1] * A[2],
                                A[1] * A[3]};
    const double productB[5] = {B[0] * B[3], B[0] * B[4] + B[1] * B[3],
                                B[0] * B[5] + B[1] * B[4] + B[2] * B[3], B[1] * B[5] + B[2] * B[4],
                                B[2] * B[5]};
    for (int k = 0; k < 4; ++k)
        EXPECT_NEAR(productA[k], a[k], 1e-11) << p.c << " " << p.d << " " << q.c << " " << q.d;
    for (int k = 0; k < 5; ++k)
        EXPECT_NEAR(productB[k], b[k], 1e-11) << p.c << " " << q.c;
}

TEST(IIRDesign, SplitsSectionsIntoFactors) {
    for (double first = 0.1; first < 3; first += 0.17)
        for (double second = 0.15; second < 3; second += 0.23)
            ExpectSplit({-std::cos(first), 0.25}, {-2 * 0.9 * std::cos(second), 0.81});
    // Double roots; real roots, alone and with a pair; nearly equal roots.
    ExpectSplit({-1.2, 0.5}, {-1.2, 0.5});
    ExpectSplit({-1.2, 0.35}, {-1.5, 0.54});
    ExpectSplit({-1.2, 0.35}, {0.2, 0.54});
    ExpectSplit({0.2, 0.54}, {-1.2, 0.35});
    for (const double near : {1e-2, 1e-3, 1e-4, 1e-5})
        ExpectSplit({-2 * (1 - near) * std::cos(near), (1 - near) * (1 - near)},
                    {-2 * (1 - near) * std::cos(2 * near), (1 - near) * (1 - near)});
    const double a[4] = {}, b[5] = {};
    double out[6];
    EXPECT_EQ(qx::FourthToSecondOrder({{a, 4}, {b, 4}, 1}, {{out, 4}, {out, 6}}),
              ErrCoefficientSizes);
    EXPECT_EQ(qx::SecondToFourthOrder({{a, 4}, {b, 6}, 0}, {{out, 3}, {out, 5}}),
              ErrCoefficientSizes);
}

// In the middle of the band, where filters of even order have a gain below 1.
TEST(IIRDesign, PutsTheGainIntoTheDecidingSection) {
    ResetHost();
    const double center = std::atan(std::sqrt(std::tan(static_cast<double>(pi) * 0.1) *
                                              std::tan(static_cast<double>(pi) * 0.23))) /
                          static_cast<double>(pi);
    const double middles[] = {0.0, 0.5, center, 0.0};
    for (int32_t type = Lowpass; type <= Bandstop; ++type)
        for (const int family : {Chebyshev, Elliptic})
            for (const int32_t order : {5, 6}) {
                const Cascade filter = Designed({family, order, type});
                EXPECT_NEAR(filter.decibels(middles[type]), order == 6 ? -1.0 : 0.0, 1e-10);
                const std::size_t last = filter.sections() - 1;
                const std::size_t lower = family == Chebyshev && type >= Bandpass ? last : 0;
                for (std::size_t s = 0; order == 6 && s <= last; ++s)
                    EXPECT_NEAR(std::abs(filter.section(s, middles[type])),
                                s == lower ? std::pow(10.0, -0.05) : 1.0, 1e-10)
                        << family << type << s;
            }
}

TEST(IIRDesign, RefusesImpossibleDesignsInOrder) {
    ResetHost();
    struct Case {
        Design design;
        ErrorCode code;
    };
    const int32_t most = std::numeric_limits<int32_t>::max();
    std::vector<Case> cases;
    for (int family = BW; family <= Bessel; ++family) {
        for (const int32_t order : {0, -1, most, most - 1, -most - 1})
            for (const int32_t type : {Lowpass, Bandpass})
                cases.push_back({{family, order, type, -1}, ErrOrderNotPositive});
        cases.insert(cases.end(),
                     {
                         {{family, 3, Lowpass, 0.0}, ErrBadCutoff},
                         {{family, 3, Bandpass, 0.1, 0.0}, ErrBadCutoff},
                         {{family, 3, Bandpass, 0.3, 0.3}, ErrBadCutoff},
                         {{family, 3, Bandstop, 0.7, 0.6}, ErrBadCutoff},
                         {{family, 3, Highpass, 0.5}, ErrBadCutoff},
                         {{family, 3, Lowpass, 0.6}, ErrBadCutoff},
                         {{family, 3, Bandpass, 0.1, 0.2, 1, 60, -1.0}, ErrBadCutoff},
                         {{family, 3, Bandpass, 0.1, 0.6, family == Chebyshev ? -1.0 : 1.0},
                          ErrAboveNyquist},
                         {{family, 3, 4}, ErrInvalidSelector},
                         {{family, 3, -1}, ErrInvalidSelector},
                         {{family, 3, Lowpass, 0.1, 0.2, 1, 60, 1, 2}, ErrInvalidSelector},
                         {{family, 3, Bandpass, 0.1, 0.2, 1, 60, 1, 2}, ErrInvalidSelector},
                     });
    }
    const Case ofRipples[] = {
        {{Chebyshev, 3, 7, 0.1, 0.2, 0.0}, ErrRippleNotPositive},
        {{InvChebyshev, 3, 7, 0.1, 0.6, 1, 0.0}, ErrAttenuationNotPositive},
        {{Elliptic, 3, Bandpass, 0.1, 0.6, 0.0, 0.0}, ErrAboveNyquist},
        {{Elliptic, 3, 7, 0.1, 0.2, 0.0, 0.0}, ErrRippleNotPositive},
        {{Elliptic, 3, 7, 0.1, 0.2, 1.0, 0.0}, ErrAttenuationNotPositive},
        {{Elliptic, 3, 7, 0.1, 0.2, 3.0, 3.0}, ErrRippleAboveAttenuation},
        {{Bessel, 200, Lowpass}, ErrBadCoefficients},
    };
    cases.insert(cases.end(), std::begin(ofRipples), std::end(ofRipples));
    for (const auto &[design, code] : cases) {
        const Cascade cascade = Designed(design);
        EXPECT_EQ(cascade.err, code) << design.family << " " << design.order << " " << design.type;
        EXPECT_TRUE(cascade.a.empty() && cascade.b.empty());
    }
    // Powers that are 0 or infinite are refused as well.
    const auto isLost = [](const Design &design) {
        const Cascade cascade = Designed(design);
        EXPECT_EQ(cascade.err, 0);
        return std::isnan(cascade.a[0] + cascade.b[0]);
    };
    for (const double ripple : {4e-16, 3083.0, 1e9})
        EXPECT_TRUE(isLost({Chebyshev, 2, Lowpass, 0.1, 0.2, ripple})) << ripple;
    for (const double ripple : {5e-16, 3082.0})
        EXPECT_FALSE(isLost({Chebyshev, 2, Lowpass, 0.1, 0.2, ripple})) << ripple;
    for (const double attenuation : {4e-16, 5242.0})
        EXPECT_TRUE(isLost({InvChebyshev, 2, Lowpass, 0.1, 0.2, 1, attenuation})) << attenuation;
    EXPECT_TRUE(isLost({Elliptic, 2, Lowpass, 0.1, 0.2, 8e-193, 40}));
    EXPECT_TRUE(isLost({Elliptic, 2, Lowpass, 0.1, 0.2, 1, 3083}));
    EXPECT_FALSE(isLost({Elliptic, 2, Lowpass, 0.1, 0.2, 1, 3082}));
    // A band edge may be half the sampling rate; NaN is not an error.
    EXPECT_EQ(Designed({BW, 3, Bandpass, 0.1, 0.5}).err, 0);
    for (int family = BW; family <= Bessel; ++family)
        for (const int32_t form : {0, 1}) {
            const Cascade lost = Designed({family, 4, Bandpass, nan, 0.2, 1, 60, 1, form});
            EXPECT_EQ(lost.err, 0);
            EXPECT_TRUE(std::isnan(lost.a[0]) && std::isnan(lost.b[0]));
        }
}

struct PoleZeroCascade : Cascade {
    std::vector<std::complex<double>> zeros, poles;
    double factor = 7.0; // the factor of the product over zeros and poles
};

std::vector<std::complex<double>> Numbers(const CDBArray &array) {
    std::vector<std::complex<double>> numbers;
    for (const auto &value : array.values())
        numbers.emplace_back(value.re, value.im);
    return numbers;
}

PoleZeroCascade DesignedByPoles(const Design &d) {
    const DBLArray a(std::vector<double>(3, 7.0)), b(std::vector<double>(3, 7.0));
    const CDBArray zeros(0), poles(0);
    PoleZeroCascade made;
    const DBL1D A = a.handle(), B = b.handle();
    const CDB1D Z = zeros.handle(), P = poles.handle();
    double *const k = &made.factor;
    const double fs = d.fs, fl = d.fl, fh = d.fh, rp = d.ripple, rs = d.attenuation;
    switch (d.family) {
    case BW:
        made.err = BWCoefs2026(fs, fl, fh, d.order, d.type, A, B, Z, P, k);
        break;
    case Chebyshev:
        made.err = ChebyshevCoefs2026(fs, fl, fh, rp, d.order, d.type, A, B, Z, P, k);
        break;
    case InvChebyshev:
        made.err = InvChebyshevCoefs2026(fs, fl, fh, rs, d.order, d.type, A, B, Z, P, k);
        break;
    case Elliptic:
        made.err = EllipticCoefs2026(fs, fl, fh, rp, rs, d.order, d.type, A, B, Z, P, k);
        break;
    default:
        made.err = BesselCoefs2026(fs, fl, fh, d.order, d.type, A, B, Z, P, k);
    }
    made.a = a.values();
    made.b = b.values();
    made.zeros = Numbers(zeros);
    made.poles = Numbers(poles);
    return made;
}

double FromNearest(const std::vector<std::complex<double>> &found, std::complex<double> exact) {
    double least = 10;
    for (const std::complex<double> one : found)
        least = std::min(least, std::abs(one - exact));
    return least;
}

// Narrow bands at 1e-4 of the rate, wide bands, and edges close to half the rate, up to order 30.
TEST(IIRDesign2026, HasPolesZerosAndGainOfFiftyDigits) {
    ResetHost();
    constexpr double pole = 0, factor = 2; // the kinds of rows; all others are zeros
    std::string last;
    PoleZeroCascade made;
    for (const TableRow &row : ReadTable(TestData("pole_zero_designs.dat"))) {
        const auto &v = row.arguments;
        const std::string design = row.text.substr(0, row.text.find(" 70.0 "));
        if (design != last)
            made = DesignedByPoles({FamilyOf(row.name), static_cast<int32_t>(v[0]),
                                    static_cast<int32_t>(v[1]), v[2], v[3], v[4], v[5]});
        last = design;
        ASSERT_EQ(made.err, 0) << design;
        if (v[6] == factor)
            EXPECT_NEAR(made.factor / v[7], 1.0, 6e-14) << row.text;
        else
            EXPECT_LT(FromNearest(v[6] == pole ? made.poles : made.zeros, {v[7], row.value}), 1e-14)
                << row.text;
    }
}

// The sections hold the poles and zeros in order, the gain is in their leading coefficients, and
// their product is the filter of the elder export.
TEST(IIRDesign2026, MakesSectionsOfItsPolesAndZeros) {
    ResetHost();
    for (int family = BW; family <= Bessel; ++family)
        for (int32_t type = Lowpass; type <= Bandstop; ++type)
            for (const int32_t order : {1, 2, 5, 8}) {
                const Design design = {family, order, type, 0.07, 0.31};
                const PoleZeroCascade made = DesignedByPoles(design);
                const std::size_t degree =
                    static_cast<std::size_t>(type >= Bandpass ? 2 * order : order);
                ASSERT_EQ(made.poles.size(), degree);
                ASSERT_EQ(made.zeros.size(), degree);
                ASSERT_EQ(made.b.size(), (degree + 1) / 2 * 3);
                double product = 1;
                std::size_t at = 0;
                for (std::size_t s = 0; s < made.sections(); ++s) {
                    const bool isFirstOrder = degree % 2 != 0 && s == 0;
                    const auto partner = [&](const auto &roots) {
                        return isFirstOrder ? 0.0 : roots[at + 1];
                    };
                    const auto p = made.poles[at], q = partner(made.poles);
                    const auto y = made.zeros[at], z = partner(made.zeros);
                    at += isFirstOrder ? 1 : 2;
                    const double lead = made.b[3 * s];
                    product *= lead;
                    EXPECT_LT(std::abs(made.a[2 * s] + p + q), 1e-15);
                    EXPECT_LT(std::abs(made.a[2 * s + 1] - p * q), 1e-15);
                    EXPECT_LT(std::abs(made.b[3 * s + 1] + lead * (y + z)), 1e-15 * lead);
                    EXPECT_LT(std::abs(made.b[3 * s + 2] - lead * (y * z)), 1e-15 * lead);
                }
                EXPECT_NEAR(product / made.factor, 1.0, 1e-14);
                const Cascade elder = Designed(design);
                for (const double f : {0.0, 0.03, 0.07, 0.15, 0.31, 0.4, 0.5})
                    EXPECT_LT(std::abs(made.at(f) - elder.at(f)), 1e-11)
                        << family << " " << type << " " << order << " " << f;
            }
}

TEST(IIRDesign2026, OrdersItsSectionsAndGivesThemUnitGainMidband) {
    ResetHost();
    for (int family = BW; family <= Bessel; ++family)
        for (int32_t type = Lowpass; type <= Bandstop; ++type) {
            const PoleZeroCascade made = DesignedByPoles({family, 9, type, 0.1, 0.12});
            ASSERT_EQ(made.err, 0);
            const double center = std::atan(std::sqrt(std::tan(0.1 * static_cast<double>(pi)) *
                                                      std::tan(0.12 * static_cast<double>(pi)))) /
                                  static_cast<double>(pi);
            const double middle[] = {0.0, 0.5, center, 0.0};
            for (std::size_t s = 0; s < made.sections(); ++s)
                EXPECT_NEAR(std::abs(made.section(s, middle[type])), 1.0, 1e-12) << family << type;
            double least = 2; // the damping of a pole, -Re S / |S|
            for (const std::complex<double> z : made.poles) {
                const std::complex<double> S = (z - 1.0) / (z + 1.0);
                EXPECT_LT(-S.real() / std::abs(S), least + 1e-12) << family << type;
                least = -S.real() / std::abs(S);
            }
        }
}

// Designs in which the elders lose digits: Bessel filters of high orders, ripples below the
// rounding of 1, narrow bands.
TEST(IIRDesign2026, DesignsWhereItsEldersLoseDigits) {
    ResetHost();
    for (const int32_t order : {40, 151, 500}) {
        const PoleZeroCascade bessel = DesignedByPoles({Bessel, order, Lowpass, 0.1});
        EXPECT_NEAR(bessel.decibels(0.1), 10 * std::log10(0.5), 1e-9);
        std::size_t reals = 0;
        for (const auto &pole : bessel.poles) {
            EXPECT_LT(std::abs(pole), 1.0);
            reals += pole.imag() == 0 ? 1 : 0;
        }
        EXPECT_EQ(reals, static_cast<std::size_t>(order % 2));
    }
    const double tiny = 1e-17;
    const PoleZeroCascade flat = DesignedByPoles({Chebyshev, 2, Lowpass, 0.1, 0.2, tiny});
    // Of order 2 and a small ripple, |H|^2 = 1 / (1 + e^2 (2 w^2 - 1)^2).
    const double excess = std::expm1(tiny * std::log(10.0) / 10);
    const double w =
        std::tan(0.4 * static_cast<double>(pi)) / std::tan(0.1 * static_cast<double>(pi));
    const double T = 2 * w * w - 1;
    EXPECT_NEAR(flat.gain(0.4), 1 / std::sqrt(1 + excess * T * T), 1e-14);
    for (const int32_t type : {Bandpass, Bandstop}) {
        const Design narrow = {BW, 8, type, 1e-3, 1.001e-3};
        const double f = 1.0002e-3;
        EXPECT_NEAR(DesignedByPoles(narrow).gain(f), ClosedFormGain(narrow, f), 1e-6);
    }
}

TEST(IIRDesign2026, RefusesImpossibleDesigns) {
    ResetHost();
    struct Case {
        Design design;
        ErrorCode code;
    };
    std::vector<Case> cases;
    for (int family = BW; family <= Bessel; ++family)
        cases.insert(cases.end(),
                     {{{family, 0, 7, nan}, ErrOrderNotPositive},
                      {{family, 501, 7, nan}, ErrLengthTooLarge},
                      {{family, 3, 4, nan}, ErrInvalidSelector},
                      {{family, 3, Lowpass, nan}, ErrBadCutoff},
                      {{family, 3, Lowpass, 0.1, 0.2, 1, 60, nan}, ErrBadCutoff},
                      {{family, 3, Bandpass, 0.3, 0.3}, ErrBadCutoff},
                      {{family, 3, Bandpass, 0.3, nan}, ErrBadCutoff},
                      {{family, 3, Highpass, 0.5, 0.2, nan, nan}, ErrAboveNyquist},
                      {{family, 3, Bandstop, 0.1, 0.5}, ErrAboveNyquist},
                      {{family, 6, Bandpass, 1e-320, 2e-320, 1, 60, 1e3}, ErrDegenerateValue}});
    for (const double level : {0.0, nan}) {
        cases.push_back({{Chebyshev, 3, Lowpass, 0.1, 0.2, level}, ErrRippleNotPositive});
        cases.push_back({{InvChebyshev, 3, 0, 0.1, 0.2, 1, level}, ErrAttenuationNotPositive});
        cases.push_back({{Elliptic, 3, Lowpass, 0.1, 0.2, level, level}, ErrRippleNotPositive});
        cases.push_back({{Elliptic, 3, Lowpass, 0.1, 0.2, 1, level}, ErrAttenuationNotPositive});
    }
    cases.push_back({{Elliptic, 3, Lowpass, 0.1, 0.2, 3, 3}, ErrRippleAboveAttenuation});
    cases.push_back({{Chebyshev, 3, Lowpass, 0.1, 0.2, 5e-324}, ErrDegenerateValue});
    cases.push_back({{InvChebyshev, 3, Lowpass, 0.1, 0.2, 1, 4000}, ErrDegenerateValue});
    cases.push_back({{Elliptic, 3, Lowpass, 0.1, 0.2, 1, 4000}, ErrDegenerateValue});
    cases.push_back({{Elliptic, 3, Lowpass, 0.1, 0.2, 1e-320}, ErrDegenerateValue});
    for (const auto &[design, code] : cases) {
        const PoleZeroCascade made = DesignedByPoles(design);
        EXPECT_EQ(made.err, code) << design.family << " " << design.order << " " << design.type;
        EXPECT_TRUE(made.a.empty() && made.poles.empty() && std::isnan(made.factor));
    }
}

} // namespace
} // namespace qx::test
