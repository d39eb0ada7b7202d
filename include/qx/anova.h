#ifndef QX_ANOVA_H
#define QX_ANOVA_H

/* Contingency table and one-way analysis of variance.

   The function result is 0 and the code stands in *err; a failure makes every result NaN. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Pearson's chi-square test of independence on a table of counts: the statistic, the sum of (O -
    E)^2 / E with E = column sum times row sum / total, and the probability of a larger one with
    (rows - 1)(columns - 1) degrees of freedom. An empty row or column gives NaN with code 0.
    Codes: ErrTableNegativeSize (a dimension is negative), ErrTableTooSmall (fewer than 2 rows or
    columns), ErrOutOfMemory (no scratch memory), ErrTableNegativeSize (a count is negative). */
QX_API int32_t Contingency_head(QX_IN I32_2D table, QX_OUT DBL *chiSquare, QX_OUT DBL *p,
                                QX_OUT ErrorCode *err);

/** One-way analysis of variance of y, whose element i belongs to the level labels[i], on *k levels:
    sums and means of squares between levels and within them (error), their ratio f and the
    probability p of a larger one. Sums of squares are differences of large sums from a single pass,
    so a large mean costs digits, and a sum that is 0 in truth, as the error of levels of equal
    values or what lies between levels of equal means, may come out as a small number of either
    sign: f is then infinite, huge or negative, and p 0 for a huge f, 1 for a negative one. The
    squares of values beyond 1e154 overflow: a sum of squares is then infinite, or f is NaN.
    Codes: ErrSizeMismatch (the lengths differ), ErrEmptyInput (y is empty), ErrAnovaFewLevels (k is
    below 2 or not below the number of observations), ErrOutOfMemory (no scratch memory),
    ErrAnovaFactorEmpty (more labels than k), ErrAnovaNoReplication (fewer),
    ErrNaNInData (f is NaN). */
QX_API int32_t Anova1Way_head(QX_IN DBL1D y, QX_IN I32_1D labels, QX_IN const int32_t *k,
                              QX_OUT DBL *ssBetween, QX_OUT DBL *msBetween, QX_OUT DBL *f,
                              QX_OUT DBL *p, QX_OUT DBL *ssError, QX_OUT DBL *msError,
                              QX_OUT DBL *ssTotal, QX_OUT ErrorCode *err);

/** As Anova1Way_head, with the value that f exceeds with probability alpha, by bisection to 1e-4,
    infinite for an alpha of 0 and up to 5.5e-17, where 1 - alpha is 1.
    Codes: ErrSizeMismatch (the lengths differ), ErrEmptyInput (y is empty), ErrAnovaFewLevels (k is
    below 2 or not below the number of observations), ErrBadSignificance (alpha lies outside [0,
    1]), ErrOutOfMemory (no scratch memory), ErrAnovaFactorEmpty (more labels than k),
    ErrAnovaNoReplication (fewer), ErrNaNInData (f is NaN). */
QX_API int32_t Anova1Way_head_2017(QX_IN DBL1D y, QX_IN I32_1D labels, QX_IN const int32_t *k,
                                   double alpha, QX_OUT DBL *ssBetween, QX_OUT DBL *msBetween,
                                   QX_OUT DBL *f, QX_OUT DBL *p, QX_OUT DBL *ssError,
                                   QX_OUT DBL *msError, QX_OUT DBL *ssTotal, QX_OUT DBL *fCritical,
                                   QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
