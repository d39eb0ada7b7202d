#ifndef QX_SPECIAL_TRICOMI_REGIONS_H
#define QX_SPECIAL_TRICOMI_REGIONS_H

namespace qx {

// U(a, b, x), x >= 0. The methods are tried in this order:
//
//   for a from 0.05 to 20, |b| <= 20 and x to 60 in double precision, if the estimated error is
//          below 4e-14: below x = 1 the connection with M, at an integer b its limit (13.2.9 of the
//          DLMF); from there on, and from 0.15 on elsewhere, the Wronskian with M and the continued
//          fraction 13.5.3. From x = 25 on after the asymptotic sum
//   the asymptotic sum (13.7.3) where its smallest term is below 9e-15, and where it ends
//   x < 0.2, and x < 1 where a < 0: the two M of 13.2.42, with gammas and sums in two doubles; at b
//          within 2^-32 of an integer the value between those at 2^-32 on both its sides, whose error
//          is of second order. In double precision, to x = 3, for parameters to 20 and b away from
//          integers where the two cancel little
//   b < 1: x^(1-b) times U(a - b + 1, 2 - b, x) (13.2.40)
//   a = 0, -1, -2, ...: (-1)^n (b)_n M(-n, b, x)
//   otherwise recurrences, in double precision and, near a zero, in two doubles: with b <= x + 1
//          downwards in a from where U is as good as 0, in a form without a difference, normalised by
//          the sum of (a - b + 1)_n (a)_n U(a + n, b, x) / n! = x^(-a); to larger b upwards
//
// At x = 0 the limit. NaN for x < 0, for arguments that are not finite, and where the estimated
// error is above 1e-12.
// Source: N. M. Temme, The numerical computation of the confluent hypergeometric function U(a, b, z),
// 1983, for the recurrence in a and its sum.
double TricomiByRegion(double x, double a, double b);

} // namespace qx

#endif
