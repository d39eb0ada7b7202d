#ifndef QX_DISTRIBUTIONS_H
#define QX_DISTRIBUTIONS_H

/* Cumulative distribution functions and their inverses.

   Scalars travel by reference. The function result is 0 and the code stands in *err; on any code
   but 0 the result is NaN. A NaN as probability is not refused: the bisections then end at the
   lower end of their bracket. docs/accuracy has the measured errors. The numbers of formulas are
   those of M. Abramowitz and I. A. Stegun, Handbook of mathematical functions, 1964. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** P(X <= x) of the standard normal distribution, by the approximation 26.2.16: absolute error
    about 1e-5.
    NaN: x in all results. */
QX_API int32_t NormDist_head(QX_IN const DBL *x, QX_OUT DBL *p);

/** P(T <= t) of Student's distribution with *dof degrees of freedom: half I_z(dof / 2, 1 / 2) for t
    < 0 and 1 less that otherwise, z = dof / (dof + t^2), I the regularised incomplete beta function
    (26.5.27).
    Codes: ErrTooFewForParameters (dof is below 1), ErrNaNInData (t is NaN).
    NaN: t refused with ErrNaNInData. */
QX_API int32_t TDist_head(QX_IN const DBL *t, QX_IN const int32_t *dof, QX_OUT DBL *p,
                          QX_OUT ErrorCode *err);

/** P(F <= f) of Fisher's distribution with *n and *d degrees of freedom, 1 - I_z(d / 2, n / 2) with
    z = d / (d + n f) (26.5.28); 0 for f up to 0.
    Codes: ErrTooFewForParameters (n or d is below 1), ErrNaNInData (f is NaN).
    NaN: f refused with ErrNaNInData. */
QX_API int32_t FDist_head(QX_IN const DBL *f, QX_IN const int32_t *n, QX_IN const int32_t *d,
                          QX_OUT DBL *p, QX_OUT ErrorCode *err);

/** P(X <= x) of the chi-square distribution with *dof degrees of freedom, the regularised
    incomplete gamma function P(dof / 2, x / 2) (26.4.19). With 0 degrees of freedom it is 0 for x
    up to 0 and NaN beyond.
    Codes: ErrTooFewForParameters (dof is below 0).
    NaN: x in all results. */
QX_API int32_t ChiSquare_head(QX_IN const DBL *x, QX_IN const int32_t *dof, QX_OUT DBL *p,
                              QX_OUT ErrorCode *err);

/** The quantile of the standard normal distribution, by the approximation 26.2.23: absolute error
    about 4.5e-4; infinite for p of 0 and 1.
    Codes: ErrProbabilityOutOfRange (p lies outside [0, 1]).
    NaN: p in all results. */
QX_API int32_t InvNdist_head(QX_IN const DBL *p, QX_OUT DBL *x, QX_OUT ErrorCode *err);

/** The quantile of Student's distribution, by bisection of [-10000, 10000] to an absolute 1e-4,
    from below; infinite for p of 0 and 1.
    Codes: ErrTooFewForParameters (dof is below 1), ErrProbabilityOutOfRange (p lies outside [0,
    1]).
    NaN: p in no result. */
QX_API int32_t InvTdist_head(QX_IN const DBL *p, QX_IN const int32_t *dof, QX_OUT DBL *t,
                             QX_OUT ErrorCode *err);

/** The quantile of Fisher's distribution, by bisection of [1e-6, 10000] to an absolute 1e-4, from
    below; 0 and infinity for p of 0 and 1.
    Codes: ErrTooFewForParameters (n or d is below 1), ErrProbabilityOutOfRange (p lies outside [0,
    1]).
    NaN: p in no result. */
QX_API int32_t InvFDist_head(QX_IN const DBL *p, QX_IN const int32_t *n, QX_IN const int32_t *d,
                             QX_OUT DBL *f, QX_OUT ErrorCode *err);

/** The quantile of the chi-square distribution, by bisection to an absolute 1e-4, from below; 0 and
    infinity for p of 0 and 1. The bracket ends at the first multiple of 5000 beyond the quantile,
    which takes about dof / 5000 evaluations of ChiSquare_head to find.
    Codes: ErrProbabilityOutOfRange (p lies outside [0, 1]), ErrTooFewForParameters (dof is below
    1).
    NaN: p in no result. */
QX_API int32_t InvChiSquare_head(QX_IN const DBL *p, QX_IN const int32_t *dof, QX_OUT DBL *x,
                                 QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
