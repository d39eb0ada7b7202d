#ifndef QX_SPECIAL_BESSEL_REAL_H
#define QX_SPECIAL_BESSEL_REAL_H

#include <cstdint>

namespace qx {

// J of real order. NaN for NaN, for orders below -200 that are not integers, and for x < 0 with
// such an order. Integer orders reflect both signs and use the kernels for integer orders. |x| <
// eps gives 0 for all other orders.
//
//   |order| > 17, x < 3.6 sqrt(|order|)   ascending series: its terms fall nearly from the start
//   order >= 200                          expansion for large order up to x = 0.3 order^2, then
//                                         Hankel's, which needs x of the size of order^2
//   otherwise the order is first brought to k = 3.6 sqrt(x), limited to [2, 17]: upwards from
//   there while order <= x or order < 0, downwards from the continued fraction above x;
//   at the order k: ascending series up to x = (0.0083 k + 0.09) k + 12.9 (0.9 k from k = 26),
//   then Hankel's form
//
// The series is summed in two doubles, so that cancellation costs no digits. Hankel's form is
// divergent: near the threshold its smallest term, about exp(-2 x), bounds the accuracy.
double BesselJ(double order, double x);

// Y of real order: for integer orders by the kernels for these, otherwise from J(order) and
// J(-order). Close to integers that difference loses as many digits as the order has in common with
// the integer. NaN for x <= 0 and orders below -200.
double BesselY(double order, double x);

// j_n and y_n: sqrt(pi / (2 x)) times J and Y of order n + 1/2.
double SphericalBesselJ(int32_t n, double x);
double SphericalBesselY(int32_t n, double x);

// I of real order: (x/2)^v exp(-x) / gamma(v + 1) M(v + 1/2, 2 v + 1, 2 x), where by Kummer's
// second theorem exp(-x) M(...) is a series of positive terms in x^2 / 4; from x = 40 and
// x = order^2 / 2 on the asymptotic form of M; from |order| = 100 on the expansion for large
// order. NaN for orders below -200 that are not integers.
double BesselI(double order, double x);

} // namespace qx

#endif
