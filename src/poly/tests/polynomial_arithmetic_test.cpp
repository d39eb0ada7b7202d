#include "qx/polynomial_arithmetic.h"

#include "qx/errors.h"
#include "qx/polynomial_roots.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <limits>
#include <numbers>
#include <string>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Numbers;
typedef std::complex<double> Complex;
typedef std::complex<long double> Long;
typedef std::vector<Complex> Complexes;

constexpr double inf = std::numeric_limits<double>::infinity();
constexpr double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double unit = 0x1p-53;

CDBArray ToHost(const Complexes &values) {
    std::vector<CDB> elements;
    for (const Complex &z : values)
        elements.push_back({z.real(), z.imag()});
    return CDBArray(elements);
}
DBLArray ToHost(const Numbers &values) { return DBLArray(values); }
Complexes Values(const CDBArray &array) {
    Complexes result;
    for (const CDB &z : array.values())
        result.emplace_back(z.re, z.im);
    return result;
}
Numbers Values(const DBLArray &array) { return array.values(); }

// Calls an export that takes two arrays and returns one; its code is in `status`.
ErrorCode status = 0;
template <class Export, class List>
List Combine(Export function, const List &p, const List &q) {
    const auto a = ToHost(p), b = ToHost(q), r = ToHost(List(3));
    status = function(a.handle(), b.handle(), r.handle());
    return Values(r);
}
template <class List>
struct Division {
    List quotient, remainder;
};
template <class Export, class List>
Division<List> Divided(Export divide, const List &p, const List &q) {
    const auto a = ToHost(p), b = ToHost(q), quotient = ToHost(List(2)),
               remainder = ToHost(List(3));
    status = divide(a.handle(), b.handle(), quotient.handle(), remainder.handle());
    return {Values(quotient), Values(remainder)};
}

// The product of factors x - root, in long double.
std::vector<Long> Product(const Complexes &roots) {
    std::vector<Long> a = {1};
    for (const Complex &root : roots) {
        a.insert(a.begin(), 0);
        for (std::size_t k = 0; k + 1 < a.size(); ++k)
            a[k] -= Long(root) * a[k + 1];
    }
    return a;
}
Numbers RealProduct(const Complexes &roots) {
    Numbers result;
    for (const Long &a : Product(roots))
        result.push_back(static_cast<double>(a.real()));
    return result;
}
Long ValueAt(const Complexes &p, Long x) {
    Long value = 0;
    for (std::size_t k = p.size(); k-- > 0;)
        value = value * x + Long(p[k]);
    return value;
}
Complexes Widened(const Numbers &p) { return Complexes(p.begin(), p.end()); }

Numbers Integers(Noise &noise, int count, int reach) {
    Numbers result;
    for (int i = 0; i < count; ++i)
        result.push_back(std::round(reach * noise.symmetric()));
    return result;
}
Complexes Paired(const Numbers &re, const Numbers &im) {
    Complexes result;
    for (std::size_t i = 0; i < re.size(); ++i)
        result.emplace_back(re[i], im[i]);
    return result;
}

// The largest difference relative to the largest coefficient; infinite if the lengths differ.
template <class List, class Reference>
double Difference(const List &found, const Reference &expected) {
    if (found.size() != expected.size())
        return inf;
    long double worst = 0, largest = 0;
    for (std::size_t i = 0; i < found.size(); ++i) {
        worst = std::max(worst, std::abs(Long(found[i]) - Long(expected[i])));
        largest = std::max(largest, std::abs(Long(expected[i])));
    }
    return static_cast<double>(worst / largest);
}

TEST(PolynomialSums, AreAsLongAsTheLongerAndKeepZeros) {
    EXPECT_EQ(Combine(AddPolyH, Numbers{1, 2, 3}, Numbers{4, 5, -3}), (Numbers{5, 7, 0}));
    EXPECT_EQ(Combine(SubtractPolyH, Numbers{1}, Numbers{4, 5}), (Numbers{-3, -5}));
    EXPECT_EQ(Combine(AddPolyH, Numbers{}, Numbers{}), Numbers{});
    EXPECT_EQ(Combine(CxSubtractPolyH, Complexes{{1, 2}, 3}, Complexes{{0, 1}}),
              (Complexes{{1, 1}, 3}));
    EXPECT_EQ(Combine(CxAddPolyH, Complexes{}, Complexes{{0, 1}}), (Complexes{{0, 1}}));
    Combine(AddPolyH, Numbers{1.7e308}, Numbers{1.7e308});
    EXPECT_EQ(status, ErrOverflow);
}

TEST(PolynomialProducts, AddTheirTermsByAscendingIndexOfTheFirst) {
    // 1e16 - 1e16 + 1 is 1 in this order and 0 in the reverse order.
    const Numbers p = {1e16, -1e16, 1}, ones(9, 1.0);
    EXPECT_EQ(Combine(MultiplyPolyH, p, ones)[2], 1.0);
    EXPECT_EQ(Combine(MultiplyPolyH, Numbers{1, 1, 1}, p)[2], 0.0);
    EXPECT_EQ(Combine(MultiplyPolyH, ones, p)[8], 0.0);
    EXPECT_EQ(Combine(CxMultiplyPolyH, Widened(p), Widened(ones))[2], 1.0);
    EXPECT_EQ(Combine(CxMultiplyPolyH, Widened(ones), Widened(p))[8], 0.0);

    EXPECT_EQ(Combine(MultiplyPolyH, Numbers{1, 2, 0}, Numbers{3, 4}), (Numbers{3, 10, 8, 0}));
    EXPECT_EQ(Combine(CxMultiplyPolyH, Complexes{{1, 1}, 2}, Complexes{{0, 1}, 1}),
              (Complexes{{-1, 1}, {1, 3}, 2}));
    EXPECT_EQ(Combine(MultiplyPolyH, Numbers{1, 2}, Numbers{}), Numbers{0});
    Combine(MultiplyPolyH, Numbers{1e200}, Numbers{1, 1e200});
    EXPECT_EQ(status, ErrOverflow);
}

TEST(PolynomialDivision, OfIntegersByMonicOnesIsExact) {
    Noise noise(1);
    for (int i = 0; i < 300; ++i) {
        const int m = 1 + i % 12, n = 1 + i % 7;
        const Numbers p = Integers(noise, m, 999), pIm = Integers(noise, m, 99);
        Numbers q = Integers(noise, n, 9), qIm = Integers(noise, n, 9);
        q.back() = 1;
        qIm.back() = 0;
        const auto whole = Divided(DividePolyH, p, q);
        Numbers back =
            Combine(AddPolyH, Combine(MultiplyPolyH, whole.quotient, q), whole.remainder);
        Numbers expected = p;
        back.resize(20);
        expected.resize(20);
        EXPECT_EQ(back, expected);
        EXPECT_EQ(whole.remainder.size(), std::max<std::size_t>(1, q.size() - 1));

        const Complexes a = Paired(p, pIm), b = Paired(q, qIm);
        const auto both = Divided(CxDividePolyH, a, b);
        Complexes again =
            Combine(CxAddPolyH, Combine(CxMultiplyPolyH, both.quotient, b), both.remainder);
        Complexes given = a;
        again.resize(20);
        given.resize(20);
        EXPECT_EQ(again, given);
    }
}

TEST(PolynomialDivision, IgnoresZeroLeadingCoefficients) {
    auto result = Divided(DividePolyH, Numbers{1, 2, 0, 0}, Numbers{1, 1, 1, 0});
    EXPECT_EQ(result.quotient, Numbers{0});
    EXPECT_EQ(result.remainder, (Numbers{1, 2}));
    result = Divided(DividePolyH, Numbers{}, Numbers{2, 1});
    EXPECT_EQ(result.quotient, Numbers{0});
    EXPECT_EQ(result.remainder, Numbers{0});
    result = Divided(DividePolyH, Numbers{1, 2, 3}, Numbers{2, 0});
    EXPECT_EQ(result.quotient, (Numbers{0.5, 1, 1.5}));
    EXPECT_EQ(result.remainder, Numbers{0});
    Divided(DividePolyH, Numbers{1, 1e300}, Numbers{1e-300});
    EXPECT_EQ(status, ErrOverflow);
}

struct Divisor {
    Complexes gcd;
    double distance;
};
Divisor CommonDivisor(const Complexes &p, const Complexes &q, double tolerance) {
    const CDBArray a = ToHost(p), b = ToHost(q), gcd(2);
    double distance = 0;
    status = CxPolyGCD_H(a.handle(), b.handle(), tolerance, gcd.handle(), &distance);
    return {Values(gcd), distance};
}
Divisor CommonDivisor(const Numbers &p, const Numbers &q, double tolerance) {
    const DBLArray a(p), b(q), gcd(2);
    double distance = 0;
    status = PolyGCD_H(a.handle(), b.handle(), tolerance, gcd.handle(), &distance);
    return {Widened(gcd.values()), distance};
}
Numbers CommonMultiple(const Numbers &p, const Numbers &q, double tolerance = 0) {
    const DBLArray a(p), b(q), lcm(2);
    status = PolyLCM_H(a.handle(), b.handle(), tolerance, lcm.handle());
    return lcm.values();
}
Complexes Joined(Complexes a, const Complexes &b) {
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

struct Common {
    Complexes roots, ofP, ofQ;
    double tolerance;
};
const std::vector<Common> commonFactors = {
    {{1, 2}, {3}, {4, 5}, 1e-13},
    {{1, 1, 1}, {2, 2}, {1, 3}, 1e-13}, // multiple, with higher multiplicity in q
    {{}, {1, 2}, {3}, 4e-15},
    {{1, 2, 3}, {}, {}, 1e-14},                // q is p
    {{0.5}, {1, 2, 3, 4, 5, 6, 7}, {}, 1e-14}, // q divides p
    {{0, 0, 1}, {0, 2}, {3}, 1e-14},           // powers of x
    {{{1, 1}, {1, -1}, -2}, {1}, {{0, 2}, {0, -2}, 3}, 1e-14},
    {{1, 2, 3, 4, 5}, {6, 7, 8, 9, 10}, {-1, -2, -3, -4, -5}, 1e-10}, // ill-conditioned
};

TEST(CommonDivisors, AreFoundWithTheirMultiplesInBothOrders) {
    for (const Common &example : commonFactors) {
        const Numbers p = RealProduct(Joined(example.roots, example.ofP));
        Numbers q = RealProduct(Joined(example.roots, example.ofQ));
        for (double &a : q)
            a *= -3e10;
        for (const bool turned : {false, true}) {
            const Divisor found = turned ? CommonDivisor(q, p, 0) : CommonDivisor(p, q, nan);
            EXPECT_LE(Difference(found.gcd, Product(example.roots)), example.tolerance);
            EXPECT_EQ(found.gcd.back(), Complex(1));
            EXPECT_LE(found.distance, 2e-15);
            const Numbers multiple = turned ? CommonMultiple(q, p) : CommonMultiple(p, q);
            EXPECT_LE(Difference(multiple,
                                 Product(Joined(Joined(example.roots, example.ofP), example.ofQ))),
                      example.tolerance);
            EXPECT_EQ(multiple.back(), 1.0);
        }
    }
}

TEST(CommonDivisors, OfComplexPolynomialsReachTheNearestPair) {
    Noise noise(3);
    const auto complexNoise = [&noise](int count) {
        Complexes result;
        for (int i = 0; i < count; ++i) {
            const double re = noise.symmetric();
            result.emplace_back(re, noise.symmetric());
        }
        return result;
    };
    const auto norm = [](const Complexes &p) {
        double sum = 0;
        for (const Complex &a : p)
            sum += std::norm(a);
        return std::sqrt(sum);
    };
    for (int i = 0; i < 60; ++i) {
        const Complexes u = complexNoise(2 + i % 6);
        Complexes p = Combine(CxMultiplyPolyH, u, complexNoise(1 + i % 5));
        Complexes q = Combine(CxMultiplyPolyH, u, complexNoise(1 + i % 7));
        Complexes monic = u;
        for (Complex &a : monic)
            a /= u.back();
        EXPECT_LE(Difference(CommonDivisor(p, q, 1e-10).gcd, monic), 1e-13);
        // Perturbed by 1e-8: there is a divisor only for a larger tolerance, at no greater distance
        // than the perturbation.
        for (Complexes *const moved : {&p, &q}) {
            const Complexes change = complexNoise(static_cast<int>(moved->size()));
            const double factor = 1e-8 * norm(*moved) / norm(change);
            for (std::size_t k = 0; k < moved->size(); ++k)
                (*moved)[k] += factor * change[k];
        }
        const Divisor near = CommonDivisor(p, q, 1e-7);
        EXPECT_EQ(near.gcd.size(), u.size());
        EXPECT_LE(near.distance, 1.5e-8);
        if (p.size() > u.size() && q.size() > u.size()) {
            EXPECT_LT(CommonDivisor(p, q, 1e-12).gcd.size(), u.size());
        }
    }
}

TEST(CommonDivisors, WithZeroAndConstants) {
    EXPECT_EQ(CommonDivisor(Numbers{0, 0}, Numbers{0, 2, 4, 0}, 0).gcd, (Complexes{0, 0.5, 1}));
    EXPECT_EQ(CommonDivisor(Numbers{3}, Numbers{0, 2, 4}, 0).gcd, Complexes{1});
    EXPECT_EQ(CommonMultiple({3}, {4, 2}), (Numbers{2, 1}));
    EXPECT_EQ(CommonMultiple({0, 0, 2}, {0, 2}), (Numbers{0, 0, 1}));
}

// Near a multiple root of a polynomial with integer coefficients, the value is a power of an exact
// difference.
TEST(PolyEv, IsAsAccurateAsInTwiceThePrecision) {
    Noise noise(4);
    for (const int degree : {1, 2, 5, 8, 12}) {
        const Numbers p = RealProduct(Complexes(degree, 1.0));
        const Complexes rotated = [&] { // (x - i)^degree
            Complexes result;
            for (const Long &a : Product(Complexes(degree, Complex(0, 1))))
                result.emplace_back(a);
            return result;
        }();
        const double gamma = 2 * degree * unit / (1 - 2 * degree * unit);
        for (const int count : {0, 1, 3, 8, 9, 31}) {
            Numbers x, im;
            for (int i = 0; i < count; ++i) {
                x.push_back(1 + std::ldexp(noise.symmetric(), -i % 20));
                im.push_back(std::ldexp(noise.symmetric(), -i % 20));
            }
            const Numbers y = Combine(PolyEv, p, x);
            ASSERT_EQ(y.size(), x.size());
            for (int i = 0; i < count; ++i) {
                const long double exact = std::pow(static_cast<long double>(x[i]) - 1, degree);
                const long double terms = std::pow(1 + std::fabs(x[i]), degree);
                EXPECT_LE(std::fabs(y[i] - exact),
                          1.01 * unit * std::fabs(exact) + gamma * gamma * terms);
            }
            const Complexes z = Paired(im, x), values = Combine(CxPolyEv, rotated, z);
            for (int i = 0; i < count; ++i) {
                Long exact = 1;
                for (int k = 0; k < degree; ++k)
                    exact *= Long(z[i]) - Long(0, 1);
                const long double terms = std::pow(1 + std::abs(z[i]), degree);
                EXPECT_LE(std::abs(Long(values[i]) - exact),
                          2 * unit * std::abs(exact) + 4 * gamma * gamma * terms);
            }
        }
    }
}

TEST(PolyEv, TakesAnyPoint) {
    EXPECT_EQ(Combine(PolyEv, Numbers{5}, Numbers{nan, inf, 1}), (Numbers{5, 5, 5}));
    const Numbers y = Combine(PolyEv, Numbers{1, 0, 2}, Numbers{nan, -inf, 1e200, 1e-300});
    EXPECT_EQ(status, 0);
    EXPECT_TRUE(std::isnan(y[0]));
    EXPECT_EQ(Numbers(y.begin() + 1, y.end()), (Numbers{inf, inf, 1}));
    // The compensation overflows, but the value does not.
    EXPECT_EQ(Combine(PolyEv, Numbers{1, 0.5}, Numbers{1.5e308}), Numbers{0.75e308});
    EXPECT_EQ(Combine(CxPolyEv, Complexes{1, 0.5}, Complexes{{1.5e308, -1e300}}),
              (Complexes{{0.75e308, -0.5e300}}));
}

template <class Matrix, class Array, class Export>
std::vector<Complex> OfMatrix(Export function, const Array &p, const Matrix &a, int32_t mode) {
    const Matrix y(1, 1);
    EXPECT_EQ(function(p.handle(), a.handle(), mode, y.handle()), 0);
    EXPECT_EQ(y.rows(), a.rows());
    EXPECT_EQ(y.cols(), a.cols());
    Complexes values;
    for (std::ptrdiff_t i = 0; i < y.size(); ++i) {
        if constexpr (requires { y[i].re; })
            values.emplace_back(y[i].re, y[i].im);
        else
            values.emplace_back(y[i]);
    }
    return values;
}

// For an upper triangular 2 by 2 matrix with a double eigenvalue l, the result has p(l) on its
// diagonal and p'(l) above it; with integers to the bit.
TEST(EvPoly2D, HasTheValuesOfElementsOrOfTheMatrix) {
    for (int degree = 0; degree <= 40; ++degree) {
        Numbers p(degree + 1, 1.0);
        double value = 0, slope = 0;
        for (int k = degree; k >= 0; --k) {
            p[k] = k % 5 - 2.0;
            slope = slope * -2 + value;
            value = value * -2 + p[k];
        }
        DBLMatrix jordan(2, 2);
        const double elements[] = {-2, 1, 0, -2};
        std::copy(elements, elements + 4, jordan.data());
        EXPECT_EQ(OfMatrix(EvPoly2D, DBLArray(p), jordan, 1), (Complexes{value, slope, 0, value}));
        CDBMatrix turned(2, 2);
        for (int i = 0; i < 4; ++i)
            turned.data()[i] = {0, elements[i]};
        // p(i x) = (p0 - p2 x^2 + ...) + i (p1 x - ...)
        Complexes factors;
        for (int k = 0; k <= degree; ++k)
            factors.push_back(p[k] * Complexes{1, {0, -1}, -1, {0, 1}}[k % 4]);
        EXPECT_EQ(OfMatrix(CxEvPoly2D, ToHost(factors), turned, 1),
                  (Complexes{value, slope, 0, value}));
    }
    DBLMatrix wide(2, 3);
    Numbers elements;
    for (int i = 0; i < 6; ++i)
        elements.push_back(wide.data()[i] = 0.3 * i - 1);
    const Numbers p = {1, -2, 0.7};
    EXPECT_EQ(OfMatrix(EvPoly2D, DBLArray(p), wide, 0), Widened(Combine(PolyEv, p, elements)));
}

template <class Export, class List>
List Derived(Export function, const List &p, int32_t order) {
    const auto a = ToHost(p), q = ToHost(List(2));
    status = function(a.handle(), order, q.handle());
    return Values(q);
}

TEST(Derivatives, AreWithinAnUlpAtEveryOrder) {
    Noise noise(5);
    Numbers p;
    for (int k = 0; k < 60; ++k)
        p.push_back(noise.symmetric());
    for (const int32_t order : {0, 1, 2, 7, 30, 59}) {
        const Numbers q = Derived(PolyDerivativeH, p, order);
        ASSERT_EQ(q.size(), p.size() - order);
        for (std::size_t k = 0; k < q.size(); ++k) {
            long double exact = p[k + order];
            for (int32_t j = 1; j <= order; ++j)
                exact *= k + j;
            EXPECT_LE(std::fabs(q[k] - exact), (unit + 60 * 0x1p-64L) * std::fabs(exact));
        }
    }
    EXPECT_EQ(Derived(PolyDerivativeH, p, 60), Numbers{0});
    EXPECT_EQ(Derived(CxPolyDerivativeH, Complexes{1, 2, {3, 1}}, 1), (Complexes{2, {6, 2}}));
    // 300! and 300! 1e-320 overflow, 150! 1e-320 does not.
    Numbers top(301, 0.0);
    top[300] = 1;
    Derived(PolyDerivativeH, top, 300);
    EXPECT_EQ(status, ErrOverflow);
    top.resize(151);
    top[150] = 0x1p-1070;
    EXPECT_EQ(Derived(PolyDerivativeH, top, 150),
              Numbers{std::ldexp(static_cast<double>(std::tgamma(151.0L) * 0x1p-800L), -270)});
}

TEST(IntegralsAndCompositions, FollowTheirDefinition) {
    const DBLArray p{6, 6, 6}, q(1);
    ASSERT_EQ(PolyIntegralH(p.handle(), -1, q.handle()), 0);
    EXPECT_EQ(q.values(), (Numbers{-1, 6, 3, 2}));
    const CDBArray z = ToHost(Complexes{{1, 1}, {2, 4}}), w(1);
    const CDB constant = {3, 4};
    ASSERT_EQ(CxPolyIntegralH(z.handle(), &constant, w.handle()), 0);
    EXPECT_EQ(Values(w), (Complexes{{3, 4}, {1, 1}, {1, 2}}));

    EXPECT_EQ(Combine(PolyComposeH, Numbers{1, 2, 3}, Numbers{4, 5, 6}),
              (Numbers{57, 130, 231, 180, 108}));
    EXPECT_EQ(Combine(PolyComposeH, Numbers{1, 2, 0}, Numbers{4, 5}), (Numbers{9, 10, 0}));
    EXPECT_EQ(Combine(PolyComposeH, Numbers{}, Numbers{4, 5}), Numbers{0});
    EXPECT_EQ(Combine(PolyComposeH, Numbers{7, 5}, Numbers{}), Numbers{7});
    EXPECT_EQ(Combine(PolyComposeH, Numbers{1, 2, 3}, Numbers{2}), Numbers{17});
    EXPECT_EQ(Combine(CxPolyComposeH, Complexes{0, 0, 1}, Complexes{{0, 1}, 1}),
              (Complexes{-1, {0, 2}, 1}));
    // Two lengths of 65536 give one beyond 2^31.
    Combine(PolyComposeH, Numbers(65536, 1.0), Numbers(65536, 1.0));
    EXPECT_EQ(status, ErrLengthTooLarge);
}

Numbers FromRoots(const Complexes &roots) {
    const CDBArray given = ToHost(roots);
    const DBLArray p(2);
    status = PolyFromRootsH(given.handle(), p.handle());
    return p.values();
}
Complexes CxFromRoots(const Complexes &roots) {
    const CDBArray given = ToHost(roots), p(2);
    EXPECT_EQ(CxPolyFromRootsH(given.handle(), p.handle()), 0);
    return Values(p);
}

TEST(PolynomialsFromRoots, KeepTheirDigitsAtHighDegrees) {
    // Roots of unity, simple and triple; multiplying them in the given order would let errors grow
    // to 1e-5 and beyond.
    for (const int times : {1, 3}) {
        Complexes roots;
        for (int i = 0; i < 64 * times; ++i)
            roots.push_back(std::polar(1.0, 2 * std::numbers::pi * (i / times) / 64));
        Numbers expected(64 * times + 1, 0.0);
        expected.back() = 1;
        expected[0] = -1;
        if (times == 3)
            expected[64] = 3, expected[128] = -3;
        EXPECT_LE(Difference(FromRoots(roots), expected), times * times * 1e-14);
        EXPECT_LE(Difference(CxFromRoots(roots), Widened(expected)), times * times * 1e-14);
    }
    // To coefficients and back.
    const Complexes roots = {3, -2, {1, 1}, {1, -1}, 0.5, {-1, 2}, {-1, -2}};
    CDBArray back = ToHost(Widened(FromRoots(roots)));
    const int32_t turns = 100;
    ErrorCode err = 1;
    CxPolyRoots_head(back.handle(), &turns, &err);
    ASSERT_EQ(err, 0);
    for (const Complex &root : roots) {
        double least = inf;
        for (const Complex &found : Values(back))
            least = std::min(least, std::abs(found - root));
        EXPECT_LE(least, 2e-14);
    }
    EXPECT_EQ(FromRoots({}), Numbers{1});
    EXPECT_EQ(CxFromRoots({{0, 1}}), (Complexes{{0, -1}, 1}));
}

TEST(PolynomialsFromRoots, PairConjugatesWithinTheirTolerance) {
    // The mean of a pair is used, and a root near its own conjugate becomes real.
    EXPECT_LE(Difference(FromRoots({{1, 1 + 4e-11}, {2, 1e-11}, {1, -1 + 4e-11}}),
                         RealProduct({{1, 1}, {1, -1}, 2})),
              1e-15);
    // Two nearly equal pairs, in any order.
    const Complexes close = {{1, 1}, {1 + 1e-11, -1}, {1, -1}, {1 + 1e-11, 1}};
    EXPECT_LE(Difference(FromRoots(close), RealProduct(close)), 1e-15);
    for (const Complexes &roots : std::vector<Complexes>{
             {{1, 1}}, {{1, -1}}, {{1, 1}, {1, -1 + 2e-10}}, {{1, 1}, {1, -1}, {1, 1}}}) {
        EXPECT_TRUE(FromRoots(roots).empty());
        EXPECT_EQ(status, ErrBadCoefficients);
    }
    FromRoots({1e200, -1e200});
    EXPECT_EQ(status, ErrOverflow);
}

struct Fractions {
    Numbers polynomial;
    Complexes poles, residues;
};
Fractions Split(const Numbers &numerator, const Numbers &denominator, double tolerance = 0) {
    const DBLArray a(numerator), b(denominator), polynomial(2);
    const CDBArray poles(3), residues(1);
    status = PartialFractionsH(a.handle(), b.handle(), tolerance, polynomial.handle(),
                               poles.handle(), residues.handle());
    return {polynomial.values(), Values(poles), Values(residues)};
}

// The difference between the sum of the fractions and the quotient at points off the poles,
// relative to the terms.
double LargestError(const Fractions &found, const Numbers &numerator, const Numbers &denominator) {
    Noise noise(6);
    long double worst = 0;
    for (int i = 0; i < 20; ++i) {
        const long double re = 4 * noise.symmetric(); // fixes the order of evaluation
        const Long x(re, 4 * noise.symmetric());
        Long sum = ValueAt(Widened(found.polynomial), x);
        long double size = std::abs(sum);
        Long power = 1;
        for (std::size_t k = 0; k < found.poles.size(); ++k) {
            const bool isNew = k == 0 || found.poles[k] != found.poles[k - 1];
            power = (isNew ? Long(1) : power) * (x - Long(found.poles[k]));
            sum += Long(found.residues[k]) / power;
            size += std::abs(Long(found.residues[k]) / power);
        }
        const Long exact = ValueAt(Widened(numerator), x) / ValueAt(Widened(denominator), x);
        worst = std::max(worst, std::abs(sum - exact) / size);
    }
    return static_cast<double>(worst);
}

TEST(PartialFractions, AddUpToTheQuotientWithPolesOfAnyMultiplicity) {
    const std::vector<Complexes> denominators = {
        {-1, -2},
        {1, 1},
        {0.1, 0.1, 0, 0, 0}, // a double root of the quadratic that remains after removing the zeros
        {{1, 2}, {1, -2}},
        {1, 1, 1, 2, 2, 3},
        {{0, 1}, {0, 1}, {0, -1}, {0, -1}, -1},
        {0, 0, 0.5, {0.3, 1}, {0.3, -1}, {0.3, 1}, {0.3, -1}, -3},
    };
    for (const Complexes &roots : denominators)
        for (const Numbers &numerator :
             {Numbers{1}, {1, 2, 0, 0}, {3, -1, 2, 5, 1, 1, 4, -2, 1, 1}}) {
            Numbers denominator = RealProduct(roots);
            for (double &a : denominator)
                a *= -2.5;
            denominator.push_back(0);
            const Fractions found = Split(numerator, denominator);
            ASSERT_EQ(status, 0);
            ASSERT_EQ(found.poles.size(), roots.size());
            EXPECT_LE(LargestError(found, numerator, denominator), 2e-13);
            for (std::size_t i = 0; i < roots.size(); ++i) {
                // Equal poles are adjacent, have the expected multiplicity and accuracy, and an
                // exact conjugate.
                const auto first =
                    std::find(found.poles.begin(), found.poles.end(), found.poles[i]);
                const auto times = std::count(first, found.poles.end(), found.poles[i]);
                EXPECT_EQ(std::count(first, first + times, found.poles[i]), times);
                const auto nearest =
                    std::min_element(roots.begin(), roots.end(), [&](Complex a, Complex b) {
                        return std::abs(a - found.poles[i]) < std::abs(b - found.poles[i]);
                    });
                EXPECT_EQ(std::count(roots.begin(), roots.end(), *nearest), times);
                EXPECT_LE(std::abs(*nearest - found.poles[i]), 1e-13);
                const auto other =
                    std::find(found.poles.begin(), found.poles.end(), std::conj(found.poles[i]));
                ASSERT_NE(other, found.poles.end());
                EXPECT_EQ(found.residues[i - (first - found.poles.begin()) +
                                         (other - found.poles.begin())],
                          std::conj(found.residues[i]));
            }
        }
}

TEST(PartialFractions, WithoutPolesOrWithSmallNumbers) {
    EXPECT_EQ(Split({1, 2}, {4, 0}).polynomial, (Numbers{0.25, 0.5}));
    EXPECT_TRUE(Split({1, 2}, {4}).poles.empty());
    EXPECT_EQ(Split({0}, {-1, 1}).residues, Complexes{0});
    // The product of the distances from one pole is 1e-330 and underflows; that of coefficient and
    // residue does not.
    Numbers denominator = RealProduct({1e-110, 2e-110, 3e-110, 1});
    const Fractions small = Split({1e-220}, denominator);
    ASSERT_EQ(status, 0);
    for (std::size_t i = 0; i < small.poles.size(); ++i) {
        if (std::abs(small.poles[i]) > 0.5) {
            EXPECT_NEAR(small.residues[i].real() / 1e-220, 1, 1e-12);
        }
    }
    // Poles separated by more than the tolerance, or by less.
    const Numbers close = RealProduct({1, 1 + 1e-4, -2});
    EXPECT_NE(Split({1}, close).poles[1], Split({1}, close).poles[2]);
    EXPECT_EQ(Split({1}, close, 1e-6).poles[1], Split({1}, close, 1e-6).poles[2]);
}

template <class Export, class List>
ErrorCode CodeOf(Export function, const List &p, const List &q) {
    const List result = Combine(function, p, q);
    EXPECT_TRUE(result.empty() || status == 0);
    return status;
}

TEST(PolynomialArithmetic, RefusesInTheOrderOfTheCodes) {
    const Numbers none, one = {1}, zeros = {0, 0}, bad = {1, nan}, large = {inf};
    for (const auto function : {AddPolyH, SubtractPolyH, MultiplyPolyH, PolyComposeH}) {
        EXPECT_EQ(CodeOf(function, none, bad), ErrNonFiniteInput);
        EXPECT_EQ(CodeOf(function, large, none), ErrNonFiniteInput);
    }
    EXPECT_EQ(CodeOf(PolyEv, none, one), ErrEmptyInput);
    EXPECT_EQ(CodeOf(PolyEv, large, one), ErrNonFiniteInput);
    const auto divide = [](const Numbers &p, const Numbers &q) {
        const auto result = Divided(DividePolyH, p, q);
        EXPECT_TRUE(result.quotient.empty() && result.remainder.empty());
        return status;
    };
    EXPECT_EQ(divide(bad, none), ErrEmptyInput);
    EXPECT_EQ(divide(bad, zeros), ErrNonFiniteInput);
    EXPECT_EQ(divide(one, zeros), ErrAllCoefficientsZero);

    const auto gcd = [](const Numbers &p, const Numbers &q, double tolerance) {
        const Divisor found = CommonDivisor(p, q, tolerance);
        EXPECT_TRUE(found.gcd.empty() && std::isnan(found.distance));
        return status;
    };
    EXPECT_EQ(gcd(bad, none, inf), ErrEmptyInput);
    EXPECT_EQ(gcd(bad, zeros, 0), ErrNonFiniteInput);
    EXPECT_EQ(gcd(zeros, zeros, inf), ErrNonFiniteInput);
    EXPECT_EQ(gcd(zeros, zeros, -inf), ErrAllCoefficientsZero);
    EXPECT_EQ(gcd(zeros, {1e300, 1e-300}, 0), ErrOverflow);
    for (const auto &[p, q, code] : std::vector<std::tuple<Numbers, Numbers, ErrorCode>>{
             {none, bad, ErrEmptyInput},
             {one, bad, ErrNonFiniteInput},
             {one, zeros, ErrAllCoefficientsZero},
             {{1e300, 1e-300}, one, ErrOverflow}}) {
        CommonMultiple(p, q);
        EXPECT_EQ(status, code);
    }

    const DBLMatrix wide(2, 3), y(1, 1);
    wide.data()[0] = nan;
    const auto matrix = [&](const Numbers &p, const DBLMatrix &a, int32_t mode) {
        return EvPoly2D(DBLArray(p).handle(), a.handle(), mode, y.handle());
    };
    EXPECT_EQ(matrix(none, wide, 2), ErrEmptyInput);
    EXPECT_EQ(matrix(bad, wide, 2), ErrInvalidSelector);
    EXPECT_EQ(matrix(bad, wide, 1), ErrNotSquare);
    EXPECT_EQ(matrix(one, wide, 0), ErrNonFiniteInput);
    DBLMatrix large2(1, 1);
    large2.data()[0] = 1e200;
    EXPECT_EQ(matrix({0, 0, 1}, large2, 1), ErrOverflow);
    EXPECT_EQ(matrix({0, 0, 1}, large2, 0), 0);
    EXPECT_EQ(y[0], inf);

    EXPECT_EQ((Derived(PolyDerivativeH, none, -1), status), ErrEmptyInput);
    EXPECT_EQ((Derived(PolyDerivativeH, bad, -1), status), ErrNegativeCount);
    EXPECT_EQ((Derived(PolyDerivativeH, bad, 0), status), ErrNonFiniteInput);
    const DBLArray q(1);
    EXPECT_EQ(PolyIntegralH(DBLArray(none).handle(), nan, q.handle()), ErrEmptyInput);
    EXPECT_EQ(PolyIntegralH(DBLArray(one).handle(), nan, q.handle()), ErrNonFiniteInput);
    EXPECT_EQ((FromRoots({{1, nan}}), status), ErrNonFiniteInput);

    EXPECT_EQ((Split(bad, none), status), ErrEmptyInput);
    EXPECT_EQ((Split(none, one), status), ErrEmptyInput);
    EXPECT_EQ((Split(bad, zeros), status), ErrNonFiniteInput);
    EXPECT_EQ((Split(one, zeros, inf), status), ErrNonFiniteInput);
    EXPECT_EQ((Split(one, zeros), status), ErrAllCoefficientsZero);
    EXPECT_EQ((Split(one, {1e300, 1, 1, 1e-300}), status), ErrOverflow);
}

} // namespace
} // namespace qx::test
