#ifndef QX_SPECIAL_BESSEL_INTEGER_H
#define QX_SPECIAL_BESSEL_INTEGER_H

namespace qx {

// The Bessel functions of integer order, n >= 0, x >= 0.
//
// Orders 0 and 1. J and Y: up to x = 8 rational forms in x^2, with the zeros of J in that range
// divided out and the logarithm of Y split off (two intervals, divided at 4); from 8 on modulus and
// phase with rational forms in 1 / x^2 (divided at 20). I: rational forms in x^2 up to 8, in 1 / x
// from there on (divided at 24). K: up to 1 with the logarithm split off; from there on rational
// forms in 1 / x (divided at 5).
//
// Near the zeros of J and Y the error is absolute, a few eps of the modulus. Y is -infinity at 0.
//
// Larger orders. J: upward recurrence while n <= x, where it is stable; otherwise downward
// recurrence from a higher order to the larger of J0 and J1 (Miller's method). Y: upward. The
// recurrences carry their rounding errors along. From order 200 on both use the expansions for
// large order, which bounds the work.
double BesselJn(double n, double x);
double BesselYn(double n, double x);

// I: the ascending series while x^2 / 4 < 10 (n + 1), otherwise the ratio to I0 by downward
// recurrence. K: upward recurrence from e^x K0 and e^x K1 to order 1000; above that the expansion
// for large order.
double BesselIn(double n, double x);
double BesselKn(double n, double x);

} // namespace qx

#endif
