#ifndef QX_SPECIAL_GAMMA_EXPORTS_H
#define QX_SPECIAL_GAMMA_EXPORTS_H

/* The gamma and beta functions, factorials, the digamma and the zeta function. The measured errors
   are in docs/accuracy. The formula numbers are those of M. Abramowitz and I. A. Stegun, Handbook
   of mathematical functions, 1964. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Beta function. Complete where x is NaN: B(a, b) = gamma(a) gamma(b) / gamma(a + b), NaN for
    arguments that are not finite and at poles of gamma. Otherwise it is the regularised incomplete
    beta function I_x(a, b): the integral of t^(a-1) (1 - t)^(b-1) from 0 to x over B(a, b), by
    continued fractions (26.5.8 and 26.5.9) that are truncated after 100 terms, which causes errors
    of up to 1e7 eps for a and b in the thousands. For 0 < x < 1 it is 1 at a = 0, 0 at b = 0 (the
    limits) and NaN at a = b = 0. NaN for a < 0, b < 0, x outside [0, 1] or an argument that is not
    finite.
    NaN: a, b in all results; x in no result. */
QX_API void QX_Beta(double a, double b, double x, QX_OUT DBL *value);

/** As QX_Beta, with a selector in place of the NaN: 1 complete, otherwise I_x(a, b).
    NaN: a, b in all results; x in some results. */
QX_API void QX_Beta_85(double a, double b, double x, QX_OUT DBL *value, int32_t selector);

/** n factorial: a table up to 33, correctly rounded products up to 50, gamma(n + 1) beyond. NaN
    for n < 0, +infinity from 171 on. */
QX_API void QX_Fact(int32_t n, QX_OUT DBL *value);

/** ln n! = ln gamma(n + 1). NaN for n < 0, 0 for n = 0 and 1. */
QX_API void QX_LnFact(int32_t n, QX_OUT DBL *value);

/** Gamma function. Complete where x is NaN: gamma(a), by a rational function on [2, 3] and the
    recurrence up to |a| = 33, by Stirling's formula and reflection beyond; NaN at 0, at negative
    integers, at -infinity and NaN. Otherwise it is the regularised lower incomplete gamma function
    P(a, x), the integral of t^(a-1) exp(-t) from 0 to x over gamma(a) (6.5.29 and 6.5.31): 0 at x =
    0, 1 at x = +infinity, +infinity for a = +infinity and x > 0; NaN for x < 0, a <= 0 and a NaN.
    For x near a the relative error grows with a: 3e3 eps at 1e3, 1e6 at 1e5 and 3e13 at 1e12;
    ChiSquare2026_head with 2 x and 2 a is within 4 eps.
    NaN: a in all results; x in no result. */
QX_API void QX_Gamma(double a, double x, QX_OUT DBL *value);

/** As QX_Gamma, with a selector in place of the NaN: 1 complete, otherwise P(a, x).
    NaN: a in all results; x in some results. */
QX_API void QX_Gamma_85(double a, double x, QX_OUT DBL *value, int32_t selector);

/** Regularised upper incomplete gamma function Q(a, x) = 1 - P(a, x): 1 at x = 0, 0 at
    x = +infinity, +infinity for a = +infinity; NaN for x < 0, a <= 0 and NaN. Large a lose digits
    as in QX_Gamma.
    NaN: a, x in all results. */
QX_API void QX_GammaC(double a, double x, QX_OUT DBL *value);

/** ln gamma(x), x >= 0: by a rational function on [2, 3] and the recurrence up to 33, by the
    asymptotic series beyond. +infinity at 0 and at +infinity; NaN for x < 0 and NaN.
    NaN: x in all results. */
QX_API void QX_LnGamma(double x, QX_OUT DBL *value);

/** Gamma(x) by Stirling's formula, sqrt(2 pi) x^(x - 1/2) exp(-x) (1 + 1 / (12 x) + ...), meant for
    x > 33. +infinity at 0 and from 709.78 on; NaN for x < 0 and NaN.
    NaN: x in all results. */
QX_API void QX_Stirling(double x, QX_OUT DBL *value);

/** Digamma function psi(x), the derivative of ln gamma(x) (6.3.2, 6.3.5, 6.3.7, 6.3.18). +infinity
    at the poles 0, -1, -2, ... and at +infinity; NaN at -infinity and NaN.
    NaN: x in all results. */
QX_API void QX_Psi(double x, QX_OUT DBL *value);

/** Riemann's zeta function, the sum of k^-x for x > 1 (23.2.1) and its continuation: rational
    forms up to x = 50, the sum over odd k (23.2.20) beyond, the reflection (23.2.6) for x < 0.
    NaN for x < -30.8148; +infinity at 1 and at +infinity.
    NaN: x in all results. */
QX_API void QX_Zeta(double x, QX_OUT DBL *value);

QX_END_DECLS

#endif
