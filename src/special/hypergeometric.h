#ifndef QX_SPECIAL_HYPERGEOMETRIC_H
#define QX_SPECIAL_HYPERGEOMETRIC_H

namespace qx {

// Within this of an integer a parameter counts as one; also the error that the hypergeometric
// routines ask of a method before they try the next.
constexpr double kHyperTolerance = 1.8334264312505186e-11;

// The arguments up to which Gauss leaves the connection with 1 - x aside.
constexpr double kGaussPfaffBelow = -0.5;
constexpr double kGauss2011PfaffBelow = 0.2;

// The sum of (a)_k (b)_k / ((c)_k k!) x^k, until a term is below 8.9e-16 of 1 + |sum|. NaN where an
// argument is not finite, |x| > 1, or x = 1 and c <= a + b; also where 10000 terms do not suffice.
//
// A sum below an eighth of its largest term is formed again in two doubles.
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
// NaN where an argument is not finite, |x| > 1, x = 1 and c <= a + b; +infinity where c is 0, -1,
// -2, ... and no series ends before.
//
// From x = 0.2 on the two parts of the last forms grow like x^(1-c) and cancel: large c loses
// digits there.
// Source: M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964, chapter 15.
double Gauss(double x, double a, double b, double c, double pfaffBelow);

} // namespace qx

#endif
