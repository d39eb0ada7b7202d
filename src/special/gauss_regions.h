#ifndef QX_SPECIAL_GAUSS_REGIONS_H
#define QX_SPECIAL_GAUSS_REGIONS_H

namespace qx {

// F(a, b; c; x), x <= 1. The methods are tried in this order:
//
//   a series that ends by a or b: BestForm of it, at any x; by c - a or c - b: with Euler's factor
//   x = 1: gamma(c) gamma(c - a - b) / (gamma(c - a) gamma(c - b)) (15.4.20 of the DLMF), c > a + b
//   x > 0.9 and x < -9, where x / (x - 1) is: the connection with 1 - x, or with 1 / (1 - x), in two
//       doubles with gammas in two doubles; where the exponent is within 2^-32 of an integer, the value
//       between those at 2^-32 on both its sides, whose error is of second order
//   otherwise, and where the two parts cancel: BestForm of the series of (a, b) in x, that of (c - a,
//       c - b) and, for x < 0.5, those of (a, c - b) and (b, c - a) in x / (x - 1)
//
// NaN for arguments that are not finite, x > 1, x = 1 with c <= a + b, and where the estimated
// error is above 1e-12; +infinity at c = 0, -1, -2, ... unless the series ends before the pole.
// Source: J. W. Pearson, S. Olver and M. A. Porter, Numerical methods for the computation of the
// confluent and Gauss hypergeometric functions, 2017.
double GaussByRegion(double x, double a, double b, double c);

} // namespace qx

#endif
