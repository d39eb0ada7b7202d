#ifndef QX_SPECIAL_BESSEL_H
#define QX_SPECIAL_BESSEL_H

/* Bessel functions and their kin, elliptic integrals and functions, Dawson, Fresnel, zeta. NaN in
   gives NaN. docs/accuracy has the measured errors. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Airy functions Ai(x), Ai'(x), Bi(x), Bi'(x). For x > 103.892 the first two are 0 and the last
    two the largest finite double. */
QX_API void QX_Airy(double x, QX_OUT DBL *ai, QX_OUT DBL *aip, QX_OUT DBL *bi, QX_OUT DBL *bip);

/** Bessel function J of real order. NaN for orders below -200 and for x < 0 unless the order is
    an integer; 0 for |x| < 2.2e-16 and orders that are not integers. */
QX_API void QX_BesselJr(double order, double x, QX_OUT DBL *value);

/** Bessel function Y of real order. NaN for x <= 0 and for orders below -200. */
QX_API void QX_BesselYr(double order, double x, QX_OUT DBL *value);

/** Spherical Bessel function j_n(x) = sqrt(pi / (2 x)) J_(n+1/2)(x). NaN for x < 0; 0 at
    +infinity; at 0 it is 1 for n = 0 and 0 otherwise. */
QX_API void QX_BesselJs(int32_t n, double x, QX_OUT DBL *value);

/** Spherical Bessel function y_n(x) = sqrt(pi / (2 x)) Y_(n+1/2)(x). NaN for x < 0; -infinity at
    0; 0 at +infinity. */
QX_API void QX_BesselYs(int32_t n, double x, QX_OUT DBL *value);

/** Modified Bessel function I of real order. NaN for orders below -200 and for x < 0 unless the
    order is an integer; at 0 with a negative order an infinity of the sign of gamma(order + 1). */
QX_API void QX_BesselIr(double order, double x, QX_OUT DBL *value);

/** Modified Bessel function K of order |n|. NaN for x < 0; +infinity at 0; 0 at +infinity. */
QX_API void QX_BesselKn(int32_t n, double x, QX_OUT DBL *value);

/** Kelvin functions ber and bei of order n, ber + i bei = J_n(x exp(3 pi i / 4)). NaN for
    infinite x. */
QX_API void QX_KelvinI(double x, int32_t n, QX_OUT DBL *ber, QX_OUT DBL *bei);

/** Kelvin functions ker and kei of order n, ker + i kei = i^-n K_n(x exp(i pi / 4)). NaN for
    x <= 0. */
QX_API void QX_KelvinK(double x, int32_t n, QX_OUT DBL *ker, QX_OUT DBL *kei);

/** Struve function H of order v. NaN for infinities, for x = 0 with v < 0, and for x < 0 unless
    the order is an integer. */
QX_API void QX_Struve(double x, double v, QX_OUT DBL *value);

/** Parabolic cylinder function D of order v. 0 at +infinity; NaN for infinite v. */
QX_API void QX_ParabolicCylinder(double x, double v, QX_OUT DBL *value);

/** Elliptic integral of the first kind by its parameter m = k^2: complete, K(m), where phi is NaN,
    else F(phi, m). NaN for m outside [0, 1]. */
QX_API void QX_Elliptic1(double m, double phi, QX_OUT DBL *value);

/** The same with a selector for what a NaN says above: 1 complete, otherwise incomplete. */
QX_API void QX_Elliptic1_85(double m, double phi, QX_OUT DBL *value, int32_t selector);

/** Elliptic integral of the second kind: complete, E(m), where phi is NaN, else E(phi, m). NaN for
    m outside [0, 1]. */
QX_API void QX_Elliptic2(double m, double phi, QX_OUT DBL *value);

/** The same with a selector for what a NaN says above: 1 complete, otherwise incomplete. */
QX_API void QX_Elliptic2_85(double m, double phi, QX_OUT DBL *value, int32_t selector);

/** Jacobian elliptic functions sn, cn, dn of u with parameter m, and the amplitude. Each pointer
    may be null. NaN for m outside [0, 1]. */
QX_API void QX_EllipticJ(double u, double m, QX_OUT DBL *sn, QX_OUT DBL *cn, QX_OUT DBL *dn,
                         QX_OUT DBL *phi);

/** Dawson's integral, exp(-x^2) times the integral of exp(t^2) from 0 to x. NaN for infinities. */
QX_API void QX_Dawson(double x, QX_OUT DBL *value);

/** Fresnel integrals: of cos(pi t^2 / 2) and sin(pi t^2 / 2) from 0 to x. */
QX_API void QX_FresnelIntegrals(double x, QX_OUT DBL *c, QX_OUT DBL *s);

/** Riemann's zeta function. NaN for x < -30.8148; +infinity at 1 and at +infinity. */
QX_API void QX_Zeta(double x, QX_OUT DBL *value);

QX_END_DECLS

#endif
