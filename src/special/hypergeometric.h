#ifndef QX_SPECIAL_HYPERGEOMETRIC_H
#define QX_SPECIAL_HYPERGEOMETRIC_H

namespace qx {

// A parameter within this distance of an integer counts as that integer. Also the error above which
// the hypergeometric routines try the next method.
constexpr double kHyperTolerance = 1.8334264312505186e-11;

// The values of pfaffBelow for the two revisions of Gauss.
constexpr double kGaussPfaffBelow = -0.5;
constexpr double kGauss2011PfaffBelow = 0.2;

// The sum of (a)_k (b)_k / ((c)_k k!) x^k, until a term is below 8.9e-16 (1 + |sum|). NaN if an
// argument is not finite, if |x| > 1, if x = 1 and c <= a + b, and if 10000 terms do not suffice.
//
// A sum below an eighth of its largest term is recomputed in two doubles.
double HyperSeries(double a, double b, double c, double x);

// The hypergeometric function F(a, b; c; x) on [-1, 1].
//
//   a or b is 0, -1, -2, ...      the series, which ends
//   c - a or c - b is             Euler's transformation 15.3.3, whose series ends
//   x < pfaffBelow                Pfaff's transformation 15.3.4, 15.3.5: its argument x / (x - 1)
//                                 lies in [-0.25, 0.5]
//   pfaffBelow <= x < 0.2         the series itself, |x| <= 0.5
//   0.2 <= x, c - a - b integer   the limit form with digamma functions, 15.3.10 to 15.3.12
//   0.2 <= x                      the connection with 1 - x, 15.3.6
//
// NaN if an argument is not finite, if |x| > 1, and if x = 1 and c <= a + b; +infinity if c is 0,
// -1, -2, ... and no series ends before the pole.
//
// From x = 0.2 on the two parts of the last forms grow like x^(1-c) and cancel, so digits are lost
// there for large c.
// Source: M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964, chapter 15.
double Gauss(double x, double a, double b, double c, double pfaffBelow);

} // namespace qx

#endif
