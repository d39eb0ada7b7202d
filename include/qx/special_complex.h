#ifndef QX_SPECIAL_COMPLEX_H
#define QX_SPECIAL_COMPLEX_H

/* Bessel functions of real order and complex argument, and Airy functions of complex argument. The
   order is any real number. Branch cuts are along the negative real axis, and the sign of a zero
   imaginary part selects the side. On the positive real axis J, Y, I, K and the Airy functions have
   a zero imaginary part; on the negative real axis so do the unscaled Airy functions. Results that
   underflow are 0. The formula numbers are those of M. Abramowitz and I. A. Stegun, Handbook of
   mathematical functions, 1964; the methods, region by region, follow D. E. Amos, Algorithm 644,
   ACM Transactions on Mathematical Software 12, 1986, except in the turning region |z| near
   |order|, which is covered by recurrence in the order from Debye's expansions. For orders and
   moduli up to 1000 the errors were about 0.7 eps and at most 17 eps, relative to the modulus of
   the value or, where the function oscillates, to its amplitude; near a zero the error relative to
   the value itself is not bounded. The measured errors are in docs/accuracy/special_complex.md. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Bessel function J of real order, a solution of z^2 w'' + z w' + (z^2 - order^2) w = 0 (9.1).
    A non-zero `scaled` multiplies the result by exp(-|Im z|). Where |z| is near |order|, the time
    of a call, here and in the other functions, is proportional to the cube root of |order|: 0.2 ms
    at 2^31.
    Codes: ErrBesselStatusOne (order or z is NaN or infinite, or z is 0 and the order is negative
    and not an integer), ErrBesselStatusFour (|z| or |order| is above 2^31: no digit can be relied
    on), ErrOverflow (the result exceeds the range), WarnLowAccuracy (|z| or |order| is above 4.7e7,
    so that the rounding of the arguments leaves less than half the digits).
    NaN: order, z.im, z.re refused with ErrBesselStatusOne. */
QX_API ErrorCode QX_CxBesselJr(double order, QX_IN const CDB *z, int32_t scaled,
                               QX_OUT CDB *result);

/** Bessel function Y of real order, (cos(order pi) J_order(z) - J_-order(z)) / sin(order pi), for
    integer orders the limit (9.1.2). A non-zero `scaled` multiplies by exp(-|Im z|).
    Codes: ErrBesselStatusOne (order or z is NaN or infinite, or z is 0), ErrBesselStatusFour (|z|
    or |order| is above 2^31), ErrOverflow (the result exceeds the range), WarnLowAccuracy (|z| or
    |order| is above 4.7e7).
    NaN: order, z.im, z.re refused with ErrBesselStatusOne. */
QX_API ErrorCode QX_CxBesselYr(double order, QX_IN const CDB *z, int32_t scaled,
                               QX_OUT CDB *result);

/** Modified Bessel function I of real order, a solution of z^2 w'' + z w' - (z^2 + order^2) w = 0
    (9.6). A non-zero `scaled` multiplies by exp(-|Re z|).
    Codes: ErrBesselStatusOne (order or z is NaN or infinite, or z is 0 and the order is negative
    and not an integer), ErrBesselStatusFour (|z| or |order| is above 2^31), ErrOverflow (the result
    exceeds the range), WarnLowAccuracy (|z| or |order| is above 4.7e7).
    NaN: order, z.im, z.re refused with ErrBesselStatusOne. */
QX_API ErrorCode QX_CxBesselIr(double order, QX_IN const CDB *z, int32_t scaled,
                               QX_OUT CDB *result);

/** Modified Bessel function K of real order, pi / 2 (I_-order(z) - I_order(z)) / sin(order pi), for
    integer orders the limit (9.6.2). A non-zero `scaled` multiplies by exp(z).
    Codes: ErrBesselStatusOne (order or z is NaN or infinite, or z is 0), ErrBesselStatusFour (|z|
    or |order| is above 2^31), ErrOverflow (the result exceeds the range), WarnLowAccuracy (|z| or
    |order| is above 4.7e7).
    NaN: order, z.im, z.re refused with ErrBesselStatusOne. */
QX_API ErrorCode QX_CxBesselKr(double order, QX_IN const CDB *z, int32_t scaled,
                               QX_OUT CDB *result);

/** Hankel function of the first kind and real order, J + i Y (9.1.3). A non-zero `scaled`
    multiplies by exp(-i z).
    Codes: ErrBesselStatusOne (order or z is NaN or infinite, or z is 0), ErrBesselStatusFour (|z|
    or |order| is above 2^31), ErrOverflow (the result exceeds the range), WarnLowAccuracy (|z| or
    |order| is above 4.7e7).
    NaN: order, z.im, z.re refused with ErrBesselStatusOne. */
QX_API ErrorCode QX_CxBesselH1r(double order, QX_IN const CDB *z, int32_t scaled,
                                QX_OUT CDB *result);

/** Hankel function of the second kind and real order, J - i Y (9.1.4). A non-zero `scaled`
    multiplies by exp(i z).
    Codes: ErrBesselStatusOne (order or z is NaN or infinite, or z is 0), ErrBesselStatusFour (|z|
    or |order| is above 2^31), ErrOverflow (the result exceeds the range), WarnLowAccuracy (|z| or
    |order| is above 4.7e7).
    NaN: order, z.im, z.re refused with ErrBesselStatusOne. */
QX_API ErrorCode QX_CxBesselH2r(double order, QX_IN const CDB *z, int32_t scaled,
                                QX_OUT CDB *result);

/** Airy function Ai, the solution of w'' = z w that decays along the positive axis (10.4). With
    zeta = 2/3 z sqrt(z), a non-zero `scaled` multiplies by exp(zeta), which has a branch cut,
    unlike Ai.
    Codes: ErrBesselStatusOne (z is NaN or infinite), ErrBesselStatusFour (|zeta| is above 2^31),
    ErrOverflow (the result exceeds the range), WarnLowAccuracy (|zeta| is above 4.7e7).
    NaN: z.im, z.re refused with ErrBesselStatusOne. */
QX_API ErrorCode QX_CxAiryAi(QX_IN const CDB *z, int32_t scaled, QX_OUT CDB *result);

/** As QX_CxAiryAi, the derivative of Ai. */
QX_API ErrorCode QX_CxAiryAiP(QX_IN const CDB *z, int32_t scaled, QX_OUT CDB *result);

/** Airy function Bi, the solution of w'' = z w that is in quadrature to Ai on the negative axis
    (10.4). With zeta = 2/3 z sqrt(z), a non-zero `scaled` multiplies by exp(-|Re zeta|).
    Codes: ErrBesselStatusOne (z is NaN or infinite), ErrBesselStatusFour (|zeta| is above 2^31),
    ErrOverflow (the result exceeds the range), WarnLowAccuracy (|zeta| is above 4.7e7).
    NaN: z.im, z.re refused with ErrBesselStatusOne. */
QX_API ErrorCode QX_CxAiryBi(QX_IN const CDB *z, int32_t scaled, QX_OUT CDB *result);

/** As QX_CxAiryBi, the derivative of Bi. */
QX_API ErrorCode QX_CxAiryBiP(QX_IN const CDB *z, int32_t scaled, QX_OUT CDB *result);

QX_END_DECLS

#endif
