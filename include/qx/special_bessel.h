#ifndef QX_SPECIAL_BESSEL_H
#define QX_SPECIAL_BESSEL_H

/* Bessel functions and related functions. A NaN argument gives NaN. The measured errors are in
   docs/accuracy. The formula numbers are those of M. Abramowitz and I. A. Stegun, Handbook of
   mathematical functions, 1964.

   A function that exceeds the largest double is infinite if its sign is known, otherwise NaN. This
   concerns ber and bei for |x| above about 1020, and the parabolic cylinder functions for orders
   above a few hundred. I, ker and kei may be NaN for arguments beyond 1e154 with orders in the
   thousands or more. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Airy functions Ai(x), Ai'(x), Bi(x), Bi'(x), the solutions of w'' = x w (10.4): Maclaurin
    series for |x| <= 2.09, and of Bi up to 8.32; modulus and phase or exponentials with rational
    corrections in zeta = 2 |x|^(3/2) / 3 beyond. For x > 103.892 the first two are 0 and the last
    two the largest finite double.
    NaN: x in all results. */
QX_API void QX_Airy(double x, QX_OUT DBL *ai, QX_OUT DBL *aip, QX_OUT DBL *bi, QX_OUT DBL *bip);

/** Bessel function J of real order, a solution of x^2 w'' + x w' + (x^2 - order^2) w = 0 (9.1): the
    ascending series, Hankel's form and recurrence in the order; rational kernels for orders 0 and
    1; for orders of 200 and above, the expansion for large order. NaN for orders below -200 and for
    x < 0 unless the order is an integer; 0 for |x| < 2.2e-16 and orders that are not integers.
    NaN: order, x in all results. */
QX_API void QX_BesselJr(double order, double x, QX_OUT DBL *value);

/** Bessel function Y of real order: kernels and upward recurrence for integers, otherwise
    (cos(order pi) J_order(x) - J_-order(x)) / sin(order pi) (9.1.2), which loses digits for orders
    close to integers. NaN for x <= 0 and for orders below -200.
    NaN: order, x in all results. */
QX_API void QX_BesselYr(double order, double x, QX_OUT DBL *value);

/** Spherical Bessel function j_n(x) = sqrt(pi / (2 x)) J_(n+1/2)(x). NaN for x < 0; 0 at
    +infinity; at 0 it is 1 for n = 0 and 0 otherwise.
    NaN: x in all results. */
QX_API void QX_BesselJs(int32_t n, double x, QX_OUT DBL *value);

/** Spherical Bessel function y_n(x) = sqrt(pi / (2 x)) Y_(n+1/2)(x). NaN for x < 0; -infinity at
    0; 0 at +infinity.
    NaN: x in all results. */
QX_API void QX_BesselYs(int32_t n, double x, QX_OUT DBL *value);

/** Modified Bessel function I of real order, (x/2)^v exp(-x) M(v + 1/2, 2 v + 1, 2 x) / gamma(v +
    1) (9.6.47), for integer orders by rational kernels and recurrence. NaN for orders below -200
    and for x < 0 unless the order is an integer; at 0 with a negative order an infinity of the sign
    of gamma(order + 1).
    NaN: order, x in all results. */
QX_API void QX_BesselIr(double order, double x, QX_OUT DBL *value);

/** Modified Bessel function K of order |n|, by upward recurrence from K_0 and K_1 by K_(k+1) =
    K_(k-1) + 2 k K_k / x (9.6.26). NaN for x < 0; +infinity at 0; 0 at +infinity.
    NaN: x in all results. */
QX_API void QX_BesselKn(int32_t n, double x, QX_OUT DBL *value);

/** Kelvin functions ber and bei of order n, ber + i bei = J_n(x exp(3 pi i / 4)) (9.9.1). NaN for
    infinite x.
    NaN: x in all results. */
QX_API void QX_KelvinI(double x, int32_t n, QX_OUT DBL *ber, QX_OUT DBL *bei);

/** Kelvin functions ker and kei of order n, ker + i kei = i^-n K_n(x exp(i pi / 4)) (9.9.2). NaN
    for x <= 0. Source of the method beyond x = 2: N. M. Temme, On the numerical evaluation of the
    modified Bessel function of the third kind, 1975.
    NaN: x in all results. */
QX_API void QX_KelvinK(double x, int32_t n, QX_OUT DBL *ker, QX_OUT DBL *kei);

/** Struve function H of order v: the ascending series (12.1.3) or the asymptotic one added to Y_v
    (12.1.29), whichever has the smaller estimate of its error. NaN for infinities, for x = 0 with
    v < 0, and for x < 0 unless the order is an integer.
    NaN: x, v in all results. */
QX_API void QX_Struve(double x, double v, QX_OUT DBL *value);

/** Parabolic cylinder function D of order v, the solution of w'' = (x^2 / 4 - v - 1 / 2) w that
    vanishes at +infinity (19.3.7): the asymptotic series (19.8.1), the two series at 0 (19.2.1,
    19.2.3) and recurrence in the order (19.6.4). 0 at +infinity; NaN for infinite v.
    NaN: x, v in all results. */
QX_API void QX_ParabolicCylinder(double x, double v, QX_OUT DBL *value);

QX_END_DECLS

#endif
