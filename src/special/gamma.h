#ifndef QX_SPECIAL_GAMMA_H
#define QX_SPECIAL_GAMMA_H

namespace qx {

// The gamma family. Arguments outside the domain give NaN; there is no status.
//
// The coefficients were given; their author is not known. They approximate
//   Gamma(2 + t), t from 0 to 1              relative error 1.3e-17
//   ln Gamma(2 + t), t from 0 to 1           relative error 2.8e-17
//   Stirling's series from x = 33 on         error 1.2e-17 (the factor), 1e-18 (its logarithm)
// before rounding, as measured with mpmath. The continued fraction of Q(a, x) is
// (1 - (1-a)/(x+2-a -) 1(2-a)/(x+4-a -) 2(3-a)/(x+6-a -) ...) / x, times exp(-x) x^a / Gamma(a);
// those of the incomplete beta function are 26.5.8 and 26.5.9 of M. Abramowitz and I. A. Stegun,
// Handbook of mathematical functions, 1964.

// Horner's rule: coef[0] x^degree + ... + coef[degree].
double PolyEval(double x, const double *coef, int degree);
// The same, with coef[0] assumed to be 1 and not read.
double PolyEvalMonic(double x, const double *coef, int degree);

// Gamma(x). For |x| > 33 by Stirling's formula and reflection, otherwise by a rational function on
// [2, 3] and the recurrence. NaN at 0 and at negative integers beyond -33.
double GammaFunction(double x);

// ln Gamma(x), x >= 0. From 33 on the asymptotic series, below it a rational function on [2, 3]
// and the recurrence. NaN for x < 0.
double LnGammaFunction(double x);

// Gamma(x) by Stirling's formula, meant for x above 33; +infinity from 709.78 on, where the
// exponential in the formula would overflow.
double StirlingGamma(double x);

// The regularised lower and upper incomplete gamma functions P(a, x) and Q(a, x): the series up to
// max(1, a), the continued fraction beyond. Both loops run until they converge. Near x = a that
// takes a number of terms proportional to sqrt(a): below a millisecond up to a = 1e9, 0.1 s at
// 1e14, 1 s near 2^53. From there on the series is geometric and has a closed form. The prefactor
// has by then lost its digits to the rounding of its logarithm.
double IncompleteGammaP(double a, double x);
double IncompleteGammaQ(double a, double x);

// The regularised incomplete beta function I_x(a, b), by the two continued fractions, which are
// truncated after 100 terms: digits are lost for a and b in the thousands and x near a / (a + b).
double IncompleteBeta(double a, double b, double x);

} // namespace qx

#endif
