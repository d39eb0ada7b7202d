#ifndef QX_SPECIAL_INTEGRALS_H
#define QX_SPECIAL_INTEGRALS_H

/* The error function, the exponential, sine, cosine and hyperbolic integrals, the dilogarithm,
   Dawson's and the Fresnel integrals. A NaN argument gives NaN. The measured errors are in
   docs/accuracy. The formula numbers are those of M. Abramowitz and I. A. Stegun, Handbook of
   mathematical functions, 1964. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Error function erf(x), 2 / sqrt(pi) times the integral of exp(-t^2) from 0 to x: a rational
    function up to |x| = 1, 1 - erfc(x) beyond. -1 and 1 at the infinities.
    NaN: x in all results. */
QX_API void QX_Erf(double x, QX_OUT DBL *value);

/** Complementary error function erfc(x) = 1 - erf(x): by QX_Erf below |x| = 1, as exp(-x^2) times a
    rational function beyond; 0 or 2 where x^2 exceeds 709.78.
    NaN: x in all results. */
QX_API void QX_ErfC(double x, QX_OUT DBL *value);

/** Exponential integral E_n(x), the integral of exp(-x t) / t^n from 1 to infinity: the expansion
    5.1.52 for n > 5000, the continued fraction 5.1.22 for x > 1, the power series 5.1.12 below,
    without its logarithmic term from n = 170 on. NaN for n < 0, x < 0 and infinities; 0 for x >
    709.78; at x = 0 it is 1 / (n - 1), or +infinity for n = 0 and 1. E_1 has an error of up to 6.4
    eps near x = 1 and takes four times as long as QX_ExpI_2026.
    NaN: x in all results. */
QX_API void QX_ExpI(double x, int32_t n, QX_OUT DBL *value);

/** As QX_ExpI, with E_1 by rational functions on four intervals, divided at 0.4, 2 and 10, with an
    error within 4 eps down to the smallest numbers. NaN for n < 0, x < 0 and infinities. */
QX_API void QX_ExpI_2026(double x, int32_t n, QX_OUT DBL *value);

/** Sine integral Si(x), the integral of sin(t) / t from 0 to x: a rational function up to |x| = 4,
    the auxiliary functions of 5.2.8 beyond. -pi / 2 and pi / 2 at the infinities.
    NaN: x in all results. */
QX_API void QX_SinI(double x, QX_OUT DBL *value);

/** Cosine integral Ci(x) = gamma + ln |x| + the integral of (cos(t) - 1) / t from 0 to |x|, by the
    methods of QX_SinI. -infinity at 0, 0 at the infinities.
    NaN: x in all results. */
QX_API void QX_CosI(double x, QX_OUT DBL *value);

/** Hyperbolic sine integral Shi(x), the integral of sinh(t) / t from 0 to x: its power series up to
    |x| = 8, Chebyshev series in 1 / |x| beyond. An infinity of the sign of x for |x| > 880.
    NaN: x in all results. */
QX_API void QX_SinhI(double x, QX_OUT DBL *value);

/** Hyperbolic cosine integral Chi(x) = gamma + ln |x| + the integral of (cosh(t) - 1) / t from 0 to
    |x|, by the methods of QX_SinhI. -infinity at 0, +infinity for |x| > 880.
    NaN: x in all results. */
QX_API void QX_CoshI(double x, QX_OUT DBL *value);

/** Dilogarithm Li2(1 - x), minus the integral of ln(t) / (t - 1) from 1 to x: a rational function
    on [0.5, 1.5], the reflections 27.7.3 and 27.7.5 outside. NaN for x < 0; pi^2 / 6 at 0, 0 at 1,
    -infinity at +infinity.
    NaN: x in all results. */
QX_API void QX_Diln(double x, QX_OUT DBL *value);

/** Dawson's integral, exp(-x^2) times the integral of exp(t^2) from 0 to x, by rational functions
    of x^2 up to |x| = 3.25, of 1 / x^2 beyond. NaN for infinities.
    NaN: x in all results. */
QX_API void QX_Dawson(double x, QX_OUT DBL *value);

/** Fresnel integrals C(x) and S(x): of cos(pi t^2 / 2) and sin(pi t^2 / 2) from 0 to x (7.3.1,
    7.3.2), by rational functions of x^4 up to |x| = 1.6, by the auxiliary functions (7.3.9,
    7.3.10) beyond. -1/2 and 1/2 at the infinities.
    NaN: x in all results. */
QX_API void QX_FresnelIntegrals(double x, QX_OUT DBL *c, QX_OUT DBL *s);

QX_END_DECLS

#endif
