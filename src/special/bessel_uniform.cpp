#include "special/bessel_uniform.h"

#include "frame/constants.h"
#include "special/airy.h"
#include "special/diagonal.h"
#include "special/extended.h"
#include "special/tables/debye.h"
#include "special/tables/uniform.h"

#include <cmath>

namespace qx {

namespace {

constexpr int kDebyeTerms = 10;

// The terms u_k(t) / order^k for t^2 = square, all real: t^k is in `power`.
template <class Term>
void DebyeTerms(double order, double t, double square, Term term) {
    double power = 1;
    for (int k = 0; k < kDebyeTerms; ++k) {
        double u = table::debye[0][k][k];
        for (int j = k - 1; j >= 0; --j)
            u = u * square + table::debye[0][k][j];
        term(k, power * u);
        power *= t / order;
    }
}

// x < order: J falls and Y grows by exp(order (alpha - tanh alpha)), order / x = cosh alpha.
OscillatingPair Monotone(double order, double x) {
    if (order > 1e153) // the squares below would overflow
        return {0, -kInfinity};
    const double s = std::sqrt((order - x) * (order + x)); // order tanh(alpha)
    const double alpha = std::log1p((s + (order - x)) / x);
    const double exponent = order * alpha - s;
    double sumJ = 0;
    double sumY = 0;
    const double t = order / s;
    DebyeTerms(order, t, t * t, [&](int k, double u) {
        sumJ += u;
        sumY += k % 2 == 0 ? u : -u;
    });
    const double scale = 1 / std::sqrt(kTwoPi * s);
    return {scale * std::exp(-exponent) * sumJ, -2 * scale * std::exp(exponent) * sumY};
}

// x > order: the oscillation with phase order (tan beta - beta) - pi / 4, order / x = cos beta.
OscillatingPair Wave(double order, double x) {
    const Extended difference = ExactSum(x, -order);
    const Extended sum = ExactSum(x, order);
    const Extended s = SquareRoot(difference * sum); // order tan(beta)
    if (!std::isfinite(s.high) || std::isnan(s.low))
        return {0, 0}; // x above 1e153: J and Y are below 1e-76 and their phase has no digits
    const double beta = std::atan2(s.high, order);
    const Extended turn = ExactProduct(order, beta);
    const Extended phase = s + Extended{-turn.high, -turn.low};
    double even = 0;
    double odd = 0;
    const double t = order / s.high; // cot(beta); u_k(i t) = i^k ...
    DebyeTerms(order, t, -t * t, [&](int k, double u) {
        const double signedTerm = k % 4 < 2 ? u : -u;
        (k % 2 == 0 ? even : odd) += signedTerm;
    });
    const double sine = std::sin(phase.high);
    const double cosine = std::cos(phase.high);
    const double s1 = sine + cosine * phase.low;
    const double c1 = cosine - sine * phase.low;
    const double scale = std::sqrt(2 / (kTwoPi * s.high)); // 1 / sqrt(2): rotation by pi / 4
    const double c = c1 + s1;
    const double q = s1 - c1;
    return {scale * (c * even + q * odd), scale * (q * even - c * odd)};
}

// Near the turning point.
OscillatingPair Turning(double order, double x) {
    const double w = (x - order) / order;
    const double slope = table::olverSlope(w);
    const double third = std::cbrt(order);
    const AiryValues airy = Airy(-w * slope * (third * third));
    const double r = 1 / (order * order);
    const double a = 1 + r * ((table::olverA1(w) - 1) + r * (table::olverA2(w) - 1));
    // B has the factor order^(-5/3), of which order^(-1/3) is in the scale
    const double c = (table::olverB0(w) + r * (table::olverB1(w) - 1)) / (order * third);
    const double scale = table::olverFactor(w) / third;
    const double y = scale * (airy.bi * a + airy.bip * c);
    return {scale * (airy.ai * a + airy.aip * c), std::isfinite(y) ? -y : -kInfinity};
}

} // namespace

OscillatingPair BesselLargeOrder(double order, double x) {
    if (x <= 0.6 * order)
        return Monotone(order, x);
    if (x < 1.7 * order)
        return Turning(order, x);
    return Wave(order, x);
}

ModifiedPair ModifiedBesselLargeOrder(double order, double x) {
    const double s = std::hypot(order, x);
    const double exponent = s - order * std::log((order + s) / x);
    double sumI = 0;
    double sumK = 0;
    const double t = order / s;
    DebyeTerms(order, t, t * t, [&](int k, double u) {
        sumI += u;
        sumK += k % 2 == 0 ? u : -u;
    });
    const double scale = 1 / std::sqrt(kTwoPi * s);
    const double half = std::exp(0.5 * exponent);
    const double inverse = std::exp(-0.5 * exponent);
    return {half * (scale * sumI * half), inverse * (0.5 * kTwoPi * scale * sumK * inverse)};
}

namespace {

Complex TimesExp(Complex factor, Complex exponent) {
    if (std::fabs(exponent.re) < 700)
        return Exp(exponent) * factor;
    // With an infinite modulus the signs of the parts would be lost.
    const Complex direction = Exp(Complex{0, exponent.im}) * factor;
    const double half = std::exp(0.5 * exponent.re);
    return {direction.re * half * half, direction.im * half * half};
}

} // namespace

ComplexModifiedPair ModifiedBesselOnDiagonal(double order, double x) {
    // z = x exp(i pi / 4): s^2 = order^2 + i x^2
    const Complex s = RootOfRightHalf(Complex{order * order, x * x});
    const Complex z = {x * kRootHalf, x * kRootHalf};
    const Complex logarithm = Log((s + order) / z); // asinh(order / z)
    const Complex exponent = s - logarithm * order;
    const Complex t = Complex{order, 0} / s;
    const Complex square = t * t;
    Complex power = {1, 0};
    Complex sumI = {0, 0};
    Complex sumK = {0, 0};
    for (int k = 0; k < kDebyeTerms; ++k) {
        Complex u = {table::debye[0][k][k], 0};
        for (int j = k - 1; j >= 0; --j)
            u = u * square + table::debye[0][k][j];
        const Complex term = power * u;
        sumI = sumI + term;
        sumK = k % 2 == 0 ? sumK + term : sumK - term;
        power = power * t * (1 / order);
    }
    const Complex scale = Complex{1, 0} / RootOfRightHalf(s * kTwoPi);
    const Complex i = TimesExp(scale * sumI, exponent);
    const Complex k = TimesExp(scale * sumK * (0.5 * kTwoPi), Complex{0, 0} - exponent);
    return {i.re, i.im, k.re, k.im};
}

} // namespace qx
