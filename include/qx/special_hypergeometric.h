#ifndef QX_SPECIAL_HYPERGEOMETRIC_EXPORTS_H
#define QX_SPECIAL_HYPERGEOMETRIC_EXPORTS_H

/* The hypergeometric functions. A parameter within 1.8e-11 of an integer counts as that integer
   where a series would end there. A series that has not converged after 10000 terms gives NaN: that
   takes parameters in the thousands and more that keep the quotient of successive terms near 1,
   such as an ending series of so many terms with x near -1 or with c of the size of a.
   docs/accuracy has the measured errors and where each method is weak. Source of the formulas: M.
   Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964, chapters 13 and 15. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Gauss's hypergeometric function F(a, b; c; x) = 2F1, the sum of (a)_k (b)_k / ((c)_k k!) x^k, on
    [-1, 1]; it is continued beyond the series' convergence at x = -1, and has its limit at x = 1.

    In this order: (1 - x)^(-a) where c = b, (1 - x)^(-b) where c = a; the series where a or b is 0,
    -1, -2, ...; Euler's transformation (15.3.3) where c - a or c - b is; for x < -0.5 Pfaff's
    (15.3.4, 15.3.5), whose argument x / (x - 1) is at most 0.5; for x < 0.2 the series itself; from
    0.2 on the connection with 1 - x (15.3.6), or its limit form with digamma functions (15.3.10 to
    15.3.12) where c - a - b is within 3.7e-9 of an integer.

    NaN where an argument is NaN or infinite, |x| > 1, or x = 1 and c <= a + b; +infinity where c is
    0, -1, -2, ... and the series does not end before. The limit form is summed to 1.8e-11; both
    forms in 1 - x lose digits like x^(1-c) where c is large and x below 0.5, and where an infinity
    arises within them they give NaN. Series that end are summed in their order, whose terms
    alternate for x > 0: beyond 32 of them, or with parameters beyond 40, no digit may be left.
    NaN: x, a, b, c in all results. */
QX_API void QX_Gauss(double x, double a, double b, double c, QX_OUT DBL *value);

/** As QX_Gauss, with Pfaff's transformation for all x < 0.2, where its argument lies in [-0.25,
    0.5]; the form to prefer. On [-0.5, 0.2) it may differ from QX_Gauss in the last digits,
    elsewhere the two are equal. */
QX_API void QX_Gauss_2011(double x, double a, double b, double c, QX_OUT DBL *value);

/** Kummer's confluent hypergeometric function M(a, b, x) = 1F1, the sum of (a)_k / ((b)_k k!) x^k.

    For |x| >= 25 the asymptotic form (13.5.1) where its estimated error is below 2.2e-14. Else the
    first method of these whose estimate is below 1.8e-11: where a and x have opposite signs and
    (b - 2 a) x > 0, the expansion in Bessel functions (13.3.7), at most 300 terms, to 2.2e-14; the
    power series, to 8.9e-16, in doubled precision where its terms cancel; the asymptotic form.
    Failing these, the series if its error is no larger than the asymptotic form's or below 1.2e-4,
    the asymptotic form if its error is below 1.2e-4, else NaN. Weak for x from -100 to -25 with a
    up to 30: few digits or NaN.

    exp(x) for a and b both infinite or equal; 1 for a = 0 and for x = 0; +infinity at x = +infinity
    for finite a and b; NaN for a NaN, for a and x both infinite, for b = 0, -1, -2, ... unless the
    series ends before.
    NaN: x, a, b in all results. */
QX_API void QX_Kummer(double x, double a, double b, QX_OUT DBL *value);

/** Tricomi's confluent hypergeometric function U(a, b, x).

    x >= 6: the asymptotic sum (13.5.2) to its smallest term, with a terminant for what follows: few
    digits close to x = 6, none where the terms rise from the first, roughly |a (1 + a - b)| > x.
    x < 6: the connection with M (13.1.3); at b within 0.0001 of an integer the mean of those at
    b - 0.0005 and b + 0.0005, which is right to about six digits.

    NaN where an argument is NaN or infinite and for x < 0; +infinity at x = 0, also where the limit
    is finite.
    NaN: x, a, b in all results. */
QX_API void QX_Tricomi(double x, double a, double b, QX_OUT DBL *value);

QX_END_DECLS

#endif
