#ifndef QX_SPECIAL_HYPERGEOMETRIC_EXPORTS_H
#define QX_SPECIAL_HYPERGEOMETRIC_EXPORTS_H

/* The hypergeometric functions. In those without 2026, a parameter within 1.8e-11 of an integer
   counts as that integer where a series would end there, and a series that has not converged after
   10000 terms gives NaN: that takes parameters in the thousands and more that keep the quotient of
   successive terms near 1, such as an ending series of so many terms with x near -1 or with c of
   the size of a. The revisions of 2026 take the parameters as they are and have an estimate of
   their error inside: where it is above 1e-12, they give NaN. docs/accuracy has the measured errors
   and where each method is weak. Source of the formulas: M. Abramowitz and I. A. Stegun, Handbook
   of mathematical functions, 1964, chapters 13 and 15. */

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
    QX_Gauss_2026 loses none of these digits.
    NaN: x, a, b, c in all results. */
QX_API void QX_Gauss(double x, double a, double b, double c, QX_OUT DBL *value);

/** As QX_Gauss, with Pfaff's transformation for all x < 0.2, where its argument lies in [-0.25,
    0.5]; the form to prefer. On [-0.5, 0.2) it may differ from QX_Gauss in the last digits,
    elsewhere the two are equal. */
QX_API void QX_Gauss_2011(double x, double a, double b, double c, QX_OUT DBL *value);

/** As QX_Gauss_2011, for all x <= 1 and region by region. A series that ends by a, b, c - a or c -
    b is summed. From 0.9 to 1, and below -9 in 1 / (1 - x), both parts of the connection (15.8.4 of
    the Digital library of mathematical functions) with gammas and sums in two doubles; where their
    exponents differ by an integer or by less than 2^-32 from one, the line between the values at
    2^-32 on its sides, whose error is of second order. Elsewhere, and where the two parts cancel,
    the series in x, in x / (x - 1) or with Euler's factor: in double precision, in two doubles, or
    in integers of as many digits as cancel.

    With |a|, |b|, |c| <= 100, x in [-100, 1): on 10^6 points no NaN and no error above 4e-14. A
    call takes some microseconds, up to a few milliseconds where hundreds of digits cancel; a sum
    that would take longer is a NaN, as is x < -1e280. NaN for a NaN or infinity, x > 1, or x = 1, c
    <= a + b, unless a or b ends the series; +infinity as QX_Gauss.
    Source: J. W. Pearson, S. Olver and M. A. Porter, Numerical methods for the computation of the
    confluent and Gauss hypergeometric functions, 2017.
    NaN: x, a, b, c in all results. */
QX_API void QX_Gauss_2026(double x, double a, double b, double c, QX_OUT DBL *value);

/** Kummer's confluent hypergeometric function M(a, b, x) = 1F1, the sum of (a)_k / ((b)_k k!) x^k.

    For |x| >= 25 the asymptotic form (13.5.1) where its estimated error is below 2.2e-14. Else the
    first method of these whose estimate is below 1.8e-11: where a and x have opposite signs and
    (b - 2 a) x > 0, the expansion in Bessel functions (13.3.7), at most 300 terms, to 2.2e-14; the
    power series, to 8.9e-16, in doubled precision where its terms cancel; the asymptotic form.
    Failing these, the series if its error is no larger than the asymptotic form's or below 1.2e-4,
    the asymptotic form if its error is below 1.2e-4, else NaN. Weak for x from -100 to -25 with a
    up to 30: few digits or NaN, where QX_Kummer_2026 has all digits but two.

    exp(x) for a and b both infinite or equal; 1 for a = 0 and for x = 0; +infinity at x = +infinity
    for finite a and b; NaN for a NaN, for a and x both infinite, for b = 0, -1, -2, ... unless the
    series ends before.
    NaN: x, a, b in all results. */
QX_API void QX_Kummer(double x, double a, double b, QX_OUT DBL *value);

/** As QX_Kummer, region by region: for |x| >= 30 both sums of the asymptotic form where their
    smallest terms are below 9e-15; else the power series, or that of exp(x) M(b - a, b, -x), in
    double precision where its terms cancel little, in two doubles, or in integers of as many digits
    as cancel.

    With |a|, |b|, |x| <= 100: on 10^6 points no NaN and no error above 2e-14; some microseconds, up
    to a few milliseconds where hundreds of digits cancel.

    exp(x) for equal a and b; 1 for a = 0 and x = 0; the limits at x = +infinity and -infinity for
    finite a and b, with their signs; NaN for a NaN, for infinite a or b, for b = 0, -1, -2, ...
    unless the series ends before.
    Source: as QX_Gauss_2026.
    NaN: x, a, b in all results. */
QX_API void QX_Kummer_2026(double x, double a, double b, QX_OUT DBL *value);

/** Tricomi's confluent hypergeometric function U(a, b, x).

    x >= 6: the asymptotic sum (13.5.2) to its smallest term, with a terminant for what follows: few
    digits close to x = 6, none where the terms rise from the first, roughly |a (1 + a - b)| > x. x
    < 6: the connection with M (13.1.3); at b within 0.0001 of an integer the mean of those at b -
    0.0005 and b + 0.0005, which is right to about six digits. QX_Tricomi_2026 has all digits but
    three everywhere.

    NaN where an argument is NaN or infinite and for x < 0; +infinity at x = 0, also where the limit
    is finite.
    NaN: x, a, b in all results. */
QX_API void QX_Tricomi(double x, double a, double b, QX_OUT DBL *value);

/** As QX_Tricomi, region by region: the asymptotic sum where its smallest term is below 9e-15; for
    x < 0.2, and x < 1 where a < 0, the connection with M, in two doubles where it cancels, next to
    an integer b the line between the values at 2^-32 on its sides; for b < 1 the same function of a
    - b + 1 and 2 - b (13.1.29); for a = -n a multiple of M(-n, b, x); else recurrences, downwards
    in a from where U is as good as 0, in a form without a difference, and upwards in b, in double
    precision or, near a zero, in two doubles.

    With |a|, |b| <= 100, x in [1e-3, 100]: on 10^6 points no NaN and no error above 8e-13; some
    microseconds, up to a few milliseconds.

    At x = 0 the limit, which is finite for b < 1 or where a is 0, -1, -2, ...; NaN where an
    argument is NaN or infinite and for x < 0.
    Source: as QX_Gauss_2026; N. M. Temme, The numerical computation of the confluent hypergeometric
    function U(a, b, z), 1983.
    NaN: x, a, b in all results. */
QX_API void QX_Tricomi_2026(double x, double a, double b, QX_OUT DBL *value);

QX_END_DECLS

#endif
