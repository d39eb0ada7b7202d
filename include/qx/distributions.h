#ifndef QX_DISTRIBUTIONS_H
#define QX_DISTRIBUTIONS_H

/* Cumulative distribution functions and their inverses.

   Scalars are passed by reference. The function result is 0 and the code is in *err; for any code
   but 0 the result is NaN. A NaN probability is refused only by the 2026 revisions; otherwise the
   bisections end at the lower end of their bracket. The measured errors are in docs/accuracy. The
   formula numbers are those of M. Abramowitz and I. A. Stegun, Handbook of mathematical functions,
   1964. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** P(X <= x) of the standard normal distribution, by the approximation 26.2.16: absolute error
    about 1e-5; in the upper tail 1 - p has no correct digit. NormDist2026_head is within 3 eps.
    NaN: x in all results. */
QX_API int32_t NormDist_head(QX_IN const DBL *x, QX_OUT DBL *p);

/** P(T <= t) of Student's distribution with *dof degrees of freedom: q = I_z(dof / 2, 1 / 2) / 2
    for t < 0 and 1 - q otherwise, with z = dof / (dof + t^2) and the regularised incomplete beta
    function I (26.5.27). The error is 1.5e5 eps at 30000 degrees of freedom and 1.4e6 eps at |t| =
    1e-6; TDist2026_head is within 4 eps.
    Codes: ErrTooFewForParameters (dof is below 1), ErrNaNInData (t is NaN).
    NaN: t refused with ErrNaNInData. */
QX_API int32_t TDist_head(QX_IN const DBL *t, QX_IN const int32_t *dof, QX_OUT DBL *p,
                          QX_OUT ErrorCode *err);

/** P(F <= f) of Fisher's distribution with *n and *d degrees of freedom, 1 - I_z(d / 2, n / 2) with
    z = d / (d + n f) (26.5.28); 0 for f not above 0. All digits are lost for small f; the error is
    2.5e5 eps at 30000 degrees of freedom. FDist2026_head is within 4 eps.
    Codes: ErrTooFewForParameters (n or d is below 1), ErrNaNInData (f is NaN).
    NaN: f refused with ErrNaNInData. */
QX_API int32_t FDist_head(QX_IN const DBL *f, QX_IN const int32_t *n, QX_IN const int32_t *d,
                          QX_OUT DBL *p, QX_OUT ErrorCode *err);

/** P(X <= x) of the chi-square distribution with *dof degrees of freedom, the regularised
    incomplete gamma function P(dof / 2, x / 2) (26.4.19). With 0 degrees of freedom it is 0 for x
    not above 0 and NaN above. The error is 1.4e5 eps at 30000 degrees of freedom, and in the upper
    tail 1 - p has no correct digit. ChiSquare2026_head is within 4 eps.
    Codes: ErrTooFewForParameters (dof is below 0).
    NaN: x in all results. */
QX_API int32_t ChiSquare_head(QX_IN const DBL *x, QX_IN const int32_t *dof, QX_OUT DBL *p,
                              QX_OUT ErrorCode *err);

/** The quantile of the standard normal distribution, by the approximation 26.2.23: absolute error
    about 4.5e-4; infinite for p of 0 and 1. InvNdist2026_head is within 4 eps, in either tail.
    Codes: ErrProbabilityOutOfRange (p is outside [0, 1]).
    NaN: p in all results. */
QX_API int32_t InvNdist_head(QX_IN const DBL *p, QX_OUT DBL *x, QX_OUT ErrorCode *err);

/** The quantile of Student's distribution, by bisection on [-10000, 10000] to an absolute error of
    1e-4, from below; infinite for p of 0 and 1. InvTdist2026_head is within 4 eps, in either tail.
    Codes: ErrTooFewForParameters (dof is below 1), ErrProbabilityOutOfRange (p is outside [0, 1]).
    NaN: p in no result. */
QX_API int32_t InvTdist_head(QX_IN const DBL *p, QX_IN const int32_t *dof, QX_OUT DBL *t,
                             QX_OUT ErrorCode *err);

/** The quantile of Fisher's distribution, by bisection on [1e-6, 10000] to an absolute error of
    1e-4, from below; 0 and infinity for p of 0 and 1. InvFDist2026_head is within 6 eps, in either
    tail.
    Codes: ErrTooFewForParameters (n or d is below 1), ErrProbabilityOutOfRange (p is outside [0,
    1]).
    NaN: p in no result. */
QX_API int32_t InvFDist_head(QX_IN const DBL *p, QX_IN const int32_t *n, QX_IN const int32_t *d,
                             QX_OUT DBL *f, QX_OUT ErrorCode *err);

/** The quantile of the chi-square distribution, by bisection to an absolute error of 1e-4, from
    below; 0 and infinity for p of 0 and 1. The bracket ends at the first multiple of 5000 beyond
    the quantile, which takes about dof / 5000 evaluations of ChiSquare_head to find.
    InvChiSquare2026_head is within 4 eps, in either tail.
    Codes: ErrProbabilityOutOfRange (p is outside [0, 1]), ErrTooFewForParameters (dof is below 1).
    NaN: p in no result. */
QX_API int32_t InvChiSquare_head(QX_IN const DBL *p, QX_IN const int32_t *dof, QX_OUT DBL *x,
                                 QX_OUT ErrorCode *err);

/** A value of the standard normal distribution at *x, within 3 eps down to the smallest numbers:
    exp(-x^2 / 2), with x^2 in twice the precision, times polynomials for the ratio of the tail to
    it. The larger of probability and survival is 1 minus the smaller. what: 0 the probability P(X
    <= x); 1 the survival P(X > x); 2 the logarithm of the probability; 3 the logarithm of the
    survival; 4 the density.
    Codes: ErrInvalidSelector (what is not 0 to 4), ErrNaNInData (x is NaN).
    NaN: x refused with ErrNaNInData. */
QX_API int32_t NormDist2026_head(QX_IN const DBL *x, QX_IN const int32_t *what, QX_OUT DBL *value,
                                 QX_OUT ErrorCode *err);

/** As NormDist2026_head, of Student's distribution with *dof degrees of freedom, which need not be
    an integer, within 4 eps and its logarithms within 4.3; values above 1e25, including infinity,
    count as 1e25, where the distribution is normal. Method: from 1 to 1e6 degrees a series or a
    continued fraction with positive terms; otherwise the smaller tail is the incomplete beta
    integral in the logarithm of t / (1 - t) by quadrature, with its leading factor in twice the
    precision (C. Loader's deviance).
    Codes: ErrInvalidSelector (what is not 0 to 4), ErrTooFewForParameters (dof is not above 0),
    ErrNaNInData (t is NaN).
    NaN: t refused with ErrNaNInData; dof refused with ErrTooFewForParameters. */
QX_API int32_t TDist2026_head(QX_IN const DBL *t, QX_IN const DBL *dof, QX_IN const int32_t *what,
                              QX_OUT DBL *value, QX_OUT ErrorCode *err);

/** As TDist2026_head, of Fisher's distribution with *n and *d degrees of freedom: 0 for f below 0.
    From 1 to 50 degrees the smaller tail is a sum of positive terms in double precision; with other
    degrees it takes some 25 times as long.
    Codes: ErrInvalidSelector (what is not 0 to 4), ErrTooFewForParameters (n or d is not above 0),
    ErrNaNInData (f is NaN).
    NaN: f refused with ErrNaNInData; n, d refused with ErrTooFewForParameters. */
QX_API int32_t FDist2026_head(QX_IN const DBL *f, QX_IN const DBL *n, QX_IN const DBL *d,
                              QX_IN const int32_t *what, QX_OUT DBL *value, QX_OUT ErrorCode *err);

/** As TDist2026_head, of the chi-square distribution: 0 for x below 0. From 1 to 400 degrees the
    smaller tail is a sum of positive terms in double precision, otherwise the incomplete gamma
    integral in the logarithm of t, which takes some 10 times as long.
    Codes: ErrInvalidSelector (what is not 0 to 4), ErrTooFewForParameters (dof is not above 0),
    ErrNaNInData (x is NaN).
    NaN: x refused with ErrNaNInData; dof refused with ErrTooFewForParameters. */
QX_API int32_t ChiSquare2026_head(QX_IN const DBL *x, QX_IN const DBL *dof,
                                  QX_IN const int32_t *what, QX_OUT DBL *value,
                                  QX_OUT ErrorCode *err);

/** The point below which, or above which, the standard normal distribution has the probability *p,
    by rational functions. tail: 0 below; 1 above. It is infinite for p of 0 and of 1. A p close to
    1 leaves few digits for the other tail: pass the probability of that tail instead, with the
    other value of *tail.
    Codes: ErrInvalidSelector (tail is neither 0 nor 1), ErrProbabilityOutOfRange (p is outside [0,
    1] or is NaN).
    NaN: p refused with ErrProbabilityOutOfRange. */
QX_API int32_t InvNdist2026_head(QX_IN const DBL *p, QX_IN const int32_t *tail, QX_OUT DBL *x,
                                 QX_OUT ErrorCode *err);

/** As InvNdist2026_head, of Student's distribution with *dof degrees of freedom, which need not be
    an integer. Points beyond the largest double are infinite. With few degrees of freedom the point
    grows as p^(-1 / dof), so that below 1 degree of freedom errors grow as 1 / dof.
    Codes: ErrInvalidSelector (tail is neither 0 nor 1), ErrTooFewForParameters (dof is not above
    0), ErrProbabilityOutOfRange (p is outside [0, 1] or is NaN).
    NaN: p refused with ErrProbabilityOutOfRange; dof refused with ErrTooFewForParameters. */
QX_API int32_t InvTdist2026_head(QX_IN const DBL *p, QX_IN const int32_t *tail,
                                 QX_IN const DBL *dof, QX_OUT DBL *t, QX_OUT ErrorCode *err);

/** As InvTdist2026_head, of Fisher's distribution; the lower end is 0, which is also the result for
    points below 1e-300. Within 4 eps from 2 degrees on; within 6 eps below, where the point changes
    faster than the probability.
    Codes: ErrInvalidSelector (tail is neither 0 nor 1), ErrTooFewForParameters (n or d is not above
    0), ErrProbabilityOutOfRange (p is outside [0, 1] or is NaN).
    NaN: p refused with ErrProbabilityOutOfRange; n, d refused with ErrTooFewForParameters. */
QX_API int32_t InvFDist2026_head(QX_IN const DBL *p, QX_IN const int32_t *tail, QX_IN const DBL *n,
                                 QX_IN const DBL *d, QX_OUT DBL *f, QX_OUT ErrorCode *err);

/** As InvFDist2026_head, of the chi-square distribution with *dof degrees of freedom.
    Codes: ErrInvalidSelector (tail is neither 0 nor 1), ErrTooFewForParameters (dof is not above
    0), ErrProbabilityOutOfRange (p is outside [0, 1] or is NaN).
    NaN: p refused with ErrProbabilityOutOfRange; dof refused with ErrTooFewForParameters. */
QX_API int32_t InvChiSquare2026_head(QX_IN const DBL *p, QX_IN const int32_t *tail,
                                     QX_IN const DBL *dof, QX_OUT DBL *x, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
