#ifndef QX_SPECIAL_HYPERGEOMETRIC_EXPORTS_H
#define QX_SPECIAL_HYPERGEOMETRIC_EXPORTS_H

/* The hypergeometric functions. In the functions without 2026 in their name, a parameter within
   1.8e-11 of an integer counts as that integer if a series would terminate there. A series that has
   not converged after 10000 terms gives NaN; this requires parameters in the thousands or more that
   keep the quotient of successive terms near 1, such as a terminating series of that many terms
   with x near -1 or with c of the size of a. The 2026 revisions take the parameters as they are and
   estimate their own error: if the estimate is above 1e-12, the result is NaN. The measured errors
   and the weak regions of each method are in docs/accuracy. Source of the formulas: M. Abramowitz
   and I. A. Stegun, Handbook of mathematical functions, 1964, chapters 13 and 15. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Gauss's hypergeometric function F(a, b; c; x) = 2F1, the sum of (a)_k (b)_k / ((c)_k k!) x^k, on
    [-1, 1]; at x = -1 it is continued analytically where the series does not converge, and at x = 1
    it is the limit.

    The methods, in this order: (1 - x)^(-a) where c = b, (1 - x)^(-b) where c = a; the series where
    a or b is 0, -1, -2, ...; Euler's transformation (15.3.3) where c - a or c - b is; for x < -0.5
    Pfaff's (15.3.4, 15.3.5), whose argument x / (x - 1) is at most 0.5; for x < 0.2 the series
    itself; from 0.2 on the connection with 1 - x (15.3.6), or its limit form with digamma functions
    (15.3.10 to 15.3.12) where c - a - b is within 3.7e-9 of an integer.

    NaN where an argument is NaN or infinite, |x| > 1, or x = 1 and c <= a + b; +infinity where c is
    0, -1, -2, ... and the series does not terminate earlier. The limit form is summed to 1.8e-11.
    From x = 0.2 on, with a and b from 0.25 to 2.5, errors reach 3e-10 where c - a - b is an integer
    and 6e-5 where it is 1e-8 from one. Both forms in 1 - x lose digits like x^(1-c) if c is large
    and x below 0.5, and give NaN if an infinity arises within them. Terminating series are summed
    in their order; their terms alternate for x > 0, so that with more than 32 terms or with
    parameters beyond 40 no digit may be left. QX_Gauss_2026 does not lose these digits.
    NaN: x, a, b, c in all results. */
QX_API void QX_Gauss(double x, double a, double b, double c, QX_OUT DBL *value);

/** As QX_Gauss, with Pfaff's transformation for all x < 0.2, where its argument is in [-0.25, 0.5].
    Prefer it to QX_Gauss. On [-0.5, 0.2) it may differ from QX_Gauss in the last digits, elsewhere
    the two are equal. */
QX_API void QX_Gauss_2011(double x, double a, double b, double c, QX_OUT DBL *value);

/** As QX_Gauss_2011, for all x <= 1 and with a method for each region. A series that terminates
    because of a, b, c - a or c - b is summed. From 0.9 to 1, and below -9 in 1 / (1 - x), both
    parts of the connection (15.8.4 of the Digital library of mathematical functions) are computed
    with gamma functions and sums in double-double precision, or from 0.75 on, where moderate
    parameters allow it, in double precision; if their exponents differ by an integer, or by less
    than 2^-32 from one, the result is linearly interpolated between the values at a distance of
    2^-32 on both sides, with an error of second order. Elsewhere, and where the two parts cancel,
    it is the series in x, in x / (x - 1) or with Euler's factor: in double precision, in
    double-double precision, or in integers with as many digits as cancel.

    With |a|, |b|, |c| <= 100, x in [-100, 1): 239527 tested points gave no NaN and no error above
    3e-14. A call takes a few microseconds, up to a few milliseconds where hundreds of digits
    cancel; a sum that would take longer gives NaN, as does x < -1e280. NaN for a NaN or infinity, x
    > 1, or x = 1, c <= a + b, unless a or b terminates the series; +infinity as in QX_Gauss.
    Source: J. W. Pearson, S. Olver and M. A. Porter, Numerical methods for the computation of the
    confluent and Gauss hypergeometric functions, 2017.
    NaN: x, a, b, c in all results. */
QX_API void QX_Gauss_2026(double x, double a, double b, double c, QX_OUT DBL *value);

/** Kummer's confluent hypergeometric function M(a, b, x) = 1F1, the sum of (a)_k / ((b)_k k!) x^k.

    For |x| >= 25 the asymptotic form (13.5.1) is used if its estimated error is below 2.2e-14.
    Otherwise it is the first of the following methods whose estimate is below 1.8e-11: where a and
    x have opposite signs and (b - 2 a) x > 0, the expansion in Bessel functions (13.3.7), at most
    300 terms, to 2.2e-14; the power series, to 8.9e-16, in doubled precision where its terms
    cancel; the asymptotic form. If none qualifies, it is the series if its error is not larger than
    that of the asymptotic form or below 1.2e-4, the asymptotic form if its error is below 1.2e-4,
    otherwise NaN. The accuracy is poor for x from -100 to -25 with a up to 30: few digits or NaN,
    where QX_Kummer_2026 has all but two digits.

    exp(x) for a and b both infinite or equal; 1 for a = 0 and for x = 0; +infinity at x = +infinity
    for finite a and b; NaN for a NaN, for a and x both infinite, for b = 0, -1, -2, ... unless the
    series terminates earlier.
    NaN: x, a, b in all results. */
QX_API void QX_Kummer(double x, double a, double b, QX_OUT DBL *value);

/** As QX_Kummer, with a method for each region: for |x| >= 30 both sums of the asymptotic form if
    their smallest terms are below 9e-15; otherwise the power series, or that of exp(x) M(b - a, b,
    -x), in double precision if its terms cancel little, in double-double precision, or in integers
    with as many digits as cancel.

    With |a|, |b|, |x| <= 100: 245733 tested points gave no NaN and no error above 2e-14. A call
    takes a few microseconds, up to a few milliseconds where hundreds of digits cancel.

    exp(x) for equal a and b; 1 for a = 0 and x = 0; the limits at x = +infinity and -infinity for
    finite a and b, with their signs; NaN for a NaN, for infinite a or b, for b = 0, -1, -2, ...
    unless the series terminates earlier. Source: as QX_Gauss_2026.
    NaN: x, a, b in all results. */
QX_API void QX_Kummer_2026(double x, double a, double b, QX_OUT DBL *value);

/** Tricomi's confluent hypergeometric function U(a, b, x).

    x >= 6: the asymptotic sum (13.5.2) up to its smallest term, with a terminant for the remainder:
    few digits close to x = 6, none if the terms increase from the first on, roughly |a (1 + a - b)|
    > x. x < 6: the connection with M (13.1.3); for b within 0.0001 of an integer the mean of the
    values at b - 0.0005 and b + 0.0005, which has about six correct digits. QX_Tricomi_2026 has all
    but three digits everywhere.

    NaN where an argument is NaN or infinite and for x < 0; +infinity at x = 0, also where the limit
    is finite.
    NaN: x, a, b in all results. */
QX_API void QX_Tricomi(double x, double a, double b, QX_OUT DBL *value);

/** As QX_Tricomi, with a method for each region: the asymptotic sum where its smallest term is
    below 9e-15; for moderate a > 0 in double precision, below 1 the connection with M or, at an
    integer b, its limit with a logarithm (13.2.9 of the Digital library of mathematical functions),
    and from 1 to 60 the Wronskian of M and U with a continued fraction for U'/U. Elsewhere for x <
    0.2, and x < 1 where a < 0, the connection with M, in double-double precision where it cancels,
    and for b close to an integer by linear interpolation between the values at a distance of 2^-32
    on both sides; for b < 1 the same function of a - b + 1 and 2 - b (13.1.29); for a = -n a
    multiple of M(-n, b, x); otherwise recurrences, downwards in a from where U is negligible, in a
    form without a difference, and upwards in b, in double precision or, near a zero, in
    double-double precision.

    With |a|, |b| <= 100, x in [1e-3, 100]: 276729 tested points gave no NaN and no error above
    5e-13. A call takes a few microseconds, up to a few milliseconds.

    At x = 0 it is the limit, which is finite for b < 1 or where a is 0, -1, -2, ...; NaN where an
    argument is NaN or infinite and for x < 0. Source: as QX_Gauss_2026; N. M. Temme, The numerical
    computation of the confluent hypergeometric function U(a, b, z), 1983.
    NaN: x, a, b in all results. */
QX_API void QX_Tricomi_2026(double x, double a, double b, QX_OUT DBL *value);

QX_END_DECLS

#endif
