#ifndef QX_ANOVA_H
#define QX_ANOVA_H

/* Contingency tables, and analysis of variance with one, two and three factors.

   Functions with an argument err have the result 0 and the code in *err; the others return the
   code. A failure sets every result to NaN and empties arrays. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Pearson's chi-square test of independence on a table of counts: the statistic, the sum of (O -
    E)^2 / E with E = column sum times row sum / total, and the probability p of a larger statistic
    with (rows - 1)(columns - 1) degrees of freedom. An empty row or column gives NaN with code 0. p
    is 1 minus the lower tail, so it has no correct digits below 1e-16; Contingency2026_head keeps
    all digits.
    Codes: ErrTableNegativeSize (a dimension is negative), ErrTableTooSmall (fewer than 2 rows or
    columns), ErrOutOfMemory (no scratch memory), ErrTableNegativeSize (a count is negative). */
QX_API int32_t Contingency_head(QX_IN I32_2D table, QX_OUT DBL *chiSquare, QX_OUT DBL *p,
                                QX_OUT ErrorCode *err);

/** As Contingency_head, with both numbers accurate to the last digits: the statistic from exact
    values of O total - (row sum)(column sum), and p from the upper tail itself, down to the
    smallest numbers. An empty row or column gives NaN with code 0.
    Codes: ErrTableNegativeSize (a dimension is negative), ErrTableTooSmall (fewer than 2 rows or
    columns), ErrOutOfMemory (no scratch memory), ErrTableNegativeSize (a count is negative). */
QX_API int32_t Contingency2026_head(QX_IN I32_2D table, QX_OUT DBL *chiSquare, QX_OUT DBL *p,
                                    QX_OUT ErrorCode *err);

/** One-way analysis of variance of y, where element i belongs to the level labels[i], with *k
    levels: sums of squares and mean squares between levels and within them (error), the ratio f of
    the mean squares and the probability p of a larger ratio. Sums of squares are differences of
    large sums from a single pass, so a large mean loses digits. A sum that should be exactly 0,
    such as the error of levels of equal values or the sum between levels of equal means, may be a
    small number of either sign: f is then infinite, huge or negative, and p is 0 for a huge f and 1
    for a negative f. The squares of values beyond 1e154 overflow: a sum of squares is then
    infinite, or f is NaN.
    Codes: ErrSizeMismatch (the lengths differ), ErrEmptyInput (y is empty), ErrAnovaFewLevels (k is
    below 2 or not below the number of observations), ErrOutOfMemory (no scratch memory),
    ErrAnovaFactorEmpty (more different labels than k), ErrAnovaNoReplication (fewer different
    labels than k), ErrNaNInData (f is NaN).
    NaN: y refused with ErrNaNInData. */
QX_API int32_t Anova1Way_head(QX_IN DBL1D y, QX_IN I32_1D labels, QX_IN const int32_t *k,
                              QX_OUT DBL *ssBetween, QX_OUT DBL *msBetween, QX_OUT DBL *f,
                              QX_OUT DBL *p, QX_OUT DBL *ssError, QX_OUT DBL *msError,
                              QX_OUT DBL *ssTotal, QX_OUT ErrorCode *err);

/** As Anova1Way_head, and with *fCritical, the value that f exceeds with probability alpha, by
    bisection to 1e-4; it is infinite for an alpha from 0 to 5.5e-17, where 1 - alpha is 1. If the
    mean is 1e6 standard deviations, less than one digit of the sums is left, and a p below 1e-16
    has no correct digits; Anova1Way_head_2026 keeps the digits.
    Codes: ErrSizeMismatch (the lengths differ), ErrEmptyInput (y is empty), ErrAnovaFewLevels (k is
    below 2 or not below the number of observations), ErrBadSignificance (alpha is outside [0, 1]),
    ErrOutOfMemory (no scratch memory), ErrAnovaFactorEmpty (more different labels than k),
    ErrAnovaNoReplication (fewer different labels than k), ErrNaNInData (f is NaN).
    NaN: y refused with ErrNaNInData; alpha in no result. */
QX_API int32_t Anova1Way_head_2017(QX_IN DBL1D y, QX_IN I32_1D labels, QX_IN const int32_t *k,
                                   double alpha, QX_OUT DBL *ssBetween, QX_OUT DBL *msBetween,
                                   QX_OUT DBL *f, QX_OUT DBL *p, QX_OUT DBL *ssError,
                                   QX_OUT DBL *msError, QX_OUT DBL *ssTotal, QX_OUT DBL *fCritical,
                                   QX_OUT ErrorCode *err);

/** As Anova1Way_head_2017, by two passes over the exact differences from one observation, in twice
    the precision: the sums of squares are the exact sums, rounded, so a sum that should be 0 is 0.
    The data are scaled by a power of 2, so that squares overflow only if the result does. p is
    computed from the upper tail itself, and fCritical is its inverse to the last digits, infinite
    for an alpha of 0.
    Codes: ErrSizeMismatch (the lengths differ), ErrEmptyInput (y is empty), ErrAnovaFewLevels (k is
    below 2 or not below the number of observations), ErrBadSignificance (alpha is outside [0, 1] or
    is NaN), ErrOutOfMemory (no scratch memory), ErrAnovaFactorEmpty (more different labels than k),
    ErrAnovaNoReplication (fewer different labels than k), ErrNaNInData (f is NaN, because all
    values are equal, or not all are finite).
    NaN: y refused with ErrNaNInData; alpha refused with ErrBadSignificance. */
QX_API int32_t Anova1Way_head_2026(QX_IN DBL1D y, QX_IN I32_1D labels, QX_IN const int32_t *k,
                                   double alpha, QX_OUT DBL *ssBetween, QX_OUT DBL *msBetween,
                                   QX_OUT DBL *f, QX_OUT DBL *p, QX_OUT DBL *ssError,
                                   QX_OUT DBL *msError, QX_OUT DBL *ssTotal, QX_OUT DBL *fCritical,
                                   QX_OUT ErrorCode *err);

/** Analysis of variance of y in two crossed factors: observation i belongs to the levels labelsA[i]
    and labelsB[i], any integers, in any order. The design is balanced: every pair of levels (cell)
    has `observations` observations. The factors have levelsA and levelsB levels; a negative number
    marks a random factor with that many levels.

    The outputs have an element for each source, in the order A, B, AB, error, total: sum of
    squares, degrees of freedom, mean square, the ratio f of the mean square to that of its
    denominator, the probability p of a larger ratio, and the denominator's degrees of freedom. A
    number that a source does not have is NaN: the error and the total have no f, and the total no
    mean square. With one observation per cell the interaction serves as the error, and its own
    source is NaN, with 0 degrees of freedom.

    The expected mean square of the denominator is that of the source without the source's own
    component. This is the unrestricted model, in which interactions with a random factor are random
    and independent. If no factor is random, the denominator is the error for all sources; otherwise
    it is AB for A and B, and the error for AB.

    Differences from one observation are taken first, and all deviations from means are formed in
    twice the precision, so f is as accurate as the data whatever their mean and scale. A sum of
    squares beyond the range of double is infinite or 0, but f is still correct. Deviations smaller
    than n 2^-100 times the range of the n observations count as 0. Unbalanced designs, nested
    factors and the restricted model are not supported.
    Codes: ErrEmptyInput (y is empty), ErrSizeMismatch (y and the labels differ in length),
    ErrAnovaFewLevels (a factor has fewer than 2 levels), ErrAnovaNoReplication (observations is
    below 1), ErrAnovaNegativeSelector (one observation per cell and a random factor),
    ErrAnovaCountMismatch (the length of y is not the product of levels and observations),
    ErrAnovaFactorEmpty (a factor has more or fewer different labels than levels), ErrAnovaCellCount
    (a cell has a different number of observations), ErrNaNInData (y contains NaN or an infinity),
    ErrAnovaDesign (a denominator is not above 0), ErrOutOfMemory (no scratch memory, or an array
    cannot be resized).
    NaN: y refused with ErrNaNInData. */
QX_API ErrorCode Anova2Way_head(QX_IN DBL1D y, QX_IN I32_1D labelsA, QX_IN I32_1D labelsB,
                                int32_t levelsA, int32_t levelsB, int32_t observations,
                                QX_OUT DBL1D sumsOfSquares, QX_OUT DBL1D degrees,
                                QX_OUT DBL1D meanSquares, QX_OUT DBL1D f, QX_OUT DBL1D p,
                                QX_OUT DBL1D denominatorDegrees);

/** As Anova2Way_head, and with the critical values that f exceeds with probability `significance`,
    within a relative 1e-9: infinite for a significance of 0 or if the value is not below 1e290, and
    0 for a significance of 1.
    Codes: ErrEmptyInput (y is empty), ErrSizeMismatch (y and the labels differ in length),
    ErrAnovaFewLevels (a factor has fewer than 2 levels), ErrAnovaNoReplication (observations is
    below 1), ErrAnovaNegativeSelector (one observation per cell and a random factor),
    ErrAnovaCountMismatch (the length of y is not the product of levels and observations),
    ErrAnovaFactorEmpty (a factor has more or fewer different labels than levels), ErrAnovaCellCount
    (a cell has a different number of observations), ErrNaNInData (y contains NaN or an infinity),
    ErrBadSignificance (significance is outside [0, 1] or is NaN), ErrAnovaDesign (a denominator is
    not above 0), ErrOutOfMemory (no scratch memory, or an array cannot be resized).
    NaN: y refused with ErrNaNInData; significance refused with ErrBadSignificance. */
QX_API ErrorCode Anova2Way_head_2017(QX_IN DBL1D y, QX_IN I32_1D labelsA, QX_IN I32_1D labelsB,
                                     int32_t levelsA, int32_t levelsB, int32_t observations,
                                     double significance, QX_OUT DBL1D sumsOfSquares,
                                     QX_OUT DBL1D degrees, QX_OUT DBL1D meanSquares, QX_OUT DBL1D f,
                                     QX_OUT DBL1D p, QX_OUT DBL1D denominatorDegrees,
                                     QX_OUT DBL1D critical);

/** As Anova2Way_head, with three factors. The sources are A, B, C, AB, AC, BC, ABC, error, total.

    If no factor is random, the error is the denominator for all sources. Otherwise it is the error
    for ABC, ABC for the interactions of two factors, and for a factor the one of its two
    interactions that contains a random factor, if only one of them does. If both do, as AB and AC
    may for A, no single mean square has the required expectation, and the denominator is MS(AB) +
    MS(AC) - MS(ABC), with the degrees of freedom of F. E. Satterthwaite (An approximate
    distribution of estimates of variance components, 1946): its square over MS(AB)^2 / df(AB) +
    MS(AC)^2 / df(AC) + MS(ABC)^2 / df(ABC), which need not be integers. If the difference nearly
    vanishes, the degrees of freedom are few and f means little; if it is not above 0, the whole
    table is refused with ErrAnovaDesign. */
QX_API ErrorCode ANOVA3Way_head(QX_IN DBL1D y, QX_IN I32_1D labelsA, QX_IN I32_1D labelsB,
                                QX_IN I32_1D labelsC, int32_t levelsA, int32_t levelsB,
                                int32_t levelsC, int32_t observations, QX_OUT DBL1D sumsOfSquares,
                                QX_OUT DBL1D degrees, QX_OUT DBL1D meanSquares, QX_OUT DBL1D f,
                                QX_OUT DBL1D p, QX_OUT DBL1D denominatorDegrees);

/** As Anova2Way_head_2017, with three factors; sources and denominators are those of
    ANOVA3Way_head. */
QX_API ErrorCode ANOVA3Way_head_2017(QX_IN DBL1D y, QX_IN I32_1D labelsA, QX_IN I32_1D labelsB,
                                     QX_IN I32_1D labelsC, int32_t levelsA, int32_t levelsB,
                                     int32_t levelsC, int32_t observations, double significance,
                                     QX_OUT DBL1D sumsOfSquares, QX_OUT DBL1D degrees,
                                     QX_OUT DBL1D meanSquares, QX_OUT DBL1D f, QX_OUT DBL1D p,
                                     QX_OUT DBL1D denominatorDegrees, QX_OUT DBL1D critical);

QX_END_DECLS

#endif
