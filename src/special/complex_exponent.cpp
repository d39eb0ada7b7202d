#include "special/complex_exponent.h"

#include "frame/constants.h"
#include "special/tables/bessel_complex.h"

#include <cmath>

namespace qx {

namespace {

Extended Twice(Extended a) { return {2 * a.high, 2 * a.low}; }
Extended Half(Extended a) { return {0.5 * a.high, 0.5 * a.low}; }

// ln(a / b), both positive: the quotient is reduced to a power of 2 times a number near k / 32.
Extended LogOfQuotient(Extended a, Extended b) {
    Extended q = a / b;
    int exponent;
    if (std::frexp(q.high, &exponent) < kRootHalf)
        --exponent;
    q = {std::ldexp(q.high, -exponent), std::ldexp(q.low, -exponent)};
    const int k = static_cast<int>(q.high * table::logarithmSteps + 0.5);
    const double near = k * (1.0 / table::logarithmSteps);
    const Extended z = (q + Extended{-near, 0}) / (q + Extended{near, 0}); // below 0.012
    const double w = z.high * z.high;
    const double series =
        z.high * w * (1.0 / 3 + w * (1.0 / 5 + w * (1.0 / 7 + w * (1.0 / 9 + w * (1.0 / 11)))));
    const Extended turns = {static_cast<double>(exponent), 0};
    return turns * table::extendedLnTwo + table::logarithms[k - table::firstLogarithm] +
           Twice({z.high, z.low + series});
}

} // namespace

Extended ExtendedArgument(Extended re, Extended im) {
    Extended x = re.high < 0 ? -re : re;
    Extended y = im.high < 0 ? -im : im;
    const bool isSteep = y.high > x.high;
    if (isSteep) {
        const Extended t = x;
        x = y;
        y = t;
    }
    if (x.high == 0)
        return {0, 0};
    const int k = static_cast<int>(y.high / x.high * table::logarithmSteps + 0.5);
    const Extended near = {k * (1.0 / table::logarithmSteps), 0};
    const Extended u = (y - near * x) / (x + near * y); // below 1 / 64
    const double w = u.high * u.high;
    const double series =
        u.high * w * (-1.0 / 3 + w * (1.0 / 5 + w * (-1.0 / 7 + w * (1.0 / 9 - w * (1.0 / 11)))));
    Extended angle = table::arcTangents[k] + Extended{u.high, u.low + series};
    if (isSteep)
        angle = table::extendedHalfPi - angle;
    if (re.high < 0)
        angle = table::extendedPi - angle;
    return im.high < 0 ? -angle : angle;
}

Complex RootOfUpperHalf(Complex z) {
    const double modulus = std::hypot(z.re, z.im);
    if (modulus == 0)
        return {0, 0};
    if (z.re >= 0) {
        const double re = std::sqrt(0.5 * (modulus + z.re));
        return {re, z.im / (2 * re)};
    }
    const double im = std::sqrt(0.5 * (modulus - z.re));
    return {z.im / (2 * im), im};
}

ExtendedComplex ExtendedRoot(ExtendedComplex z) { // one step of Newton's method
    const Complex root = RootOfUpperHalf({z.re.high, z.im.high});
    const Extended square = ExactProduct(root.re, root.re) - ExactProduct(root.im, root.im);
    const Complex rest = {(z.re - square).high,
                          (z.im - Twice(ExactProduct(root.re, root.im))).high};
    const Complex step = rest / (root * 2);
    return {ExactSum(root.re, step.re), ExactSum(root.im, step.im)};
}

DebyeExponent ExponentOfDebye(Extended order, Complex z) {
    // order^2 + z^2 = x^2 - (y + order) (y - order) + 2 i x y
    const Extended squareX = ExactProduct(z.re, z.re);
    const Extended x = {z.re, 0};
    const Extended y = {z.im, 0};
    const Extended crossed = (y + order) * (y - order);
    const ExtendedComplex s = ExtendedRoot({squareX - crossed, Twice(ExactProduct(z.re, z.im))});
    const ExtendedComplex a = {order + s.re, s.im};
    const Extended logarithm =
        LogOfQuotient(a.re * a.re + a.im * a.im, squareX + ExactProduct(z.im, z.im));
    const Extended angle = ExtendedArgument(a.re * x + a.im * y, a.im * x - a.re * y);
    return {{s.re.high, s.im.high}, {s.re - order * Half(logarithm), s.im - order * angle}};
}

Complex Value(const Exponential &term, const ExtendedComplex &scale) {
    if (term.factor.re == 0 && term.factor.im == 0)
        return {0, 0};
    const Extended re = term.exponent.re + scale.re;
    const Extended im = term.exponent.im + scale.im;
    Complex value = term.factor;
    if (im.high != 0) {
        const double sine = std::sin(im.high);
        const double cosine = std::cos(im.high);
        value = value * Complex{cosine - sine * im.low, sine + cosine * im.low};
    }
    if (re.high == 0 && re.low == 0)
        return value;
    if (std::fabs(re.high) < 700) {
        const double size = std::exp(re.high);
        return value * (size + size * re.low);
    }
    const double half = std::exp(0.5 * re.high) * (1 + 0.5 * re.low);
    return value * half * half;
}

} // namespace qx
