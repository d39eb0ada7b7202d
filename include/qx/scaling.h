#ifndef QX_SCALING_H
#define QX_SCALING_H

/* Scaling, standardising and unwrapping of arrays, in place. A failure empties the array and sets
   the scalar outputs to NaN. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Maps x to the range -1 to 1: (x - offset) / scale with scale = (max - min) / 2 and
    offset = min + scale. NaN is ignored; if all elements are NaN, the array is unchanged and both
    numbers are NaN. If 1 / scale is not finite, as for a constant array, scale is returned as 1 and
    only the offset is subtracted. If max - min overflows, scale and offset are infinite and x
    becomes NaN.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in some results. */
QX_API int32_t Scale(QX_INOUT DBL2D x, QX_OUT double *scale, QX_OUT double *offset,
                     QX_OUT ErrorCode *err);
/** As Scale, for one dimension, and with the two numbers in the other order. */
QX_API int32_t Scale1DCIN(QX_INOUT DBL1D x, QX_OUT double *offset, QX_OUT double *scale,
                          QX_OUT ErrorCode *err);

/** Divides x by its largest magnitude, which is returned in `scale`. NaN is ignored. An array with
    no magnitude above 0 is unchanged, and the scale is 0. If the magnitude is at most 5.5e-309, its
    reciprocal overflows: elements of x become infinite, and zeros become NaN.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in some results. */
QX_API int32_t QScale(QX_INOUT DBL2D x, QX_OUT double *scale, QX_OUT ErrorCode *err);
/** As QScale, for one dimension. */
QX_API int32_t QS1D(QX_INOUT DBL1D x, QX_OUT double *scale, QX_OUT ErrorCode *err);

/** Standardises x: (x - mean) / sd with the mean and the population standard deviation
    sqrt(sum((x - mean)^2) / n) of its elements. Each sum is formed from sixteen partial sums. A
    constant array becomes NaN, or 1, -1 or infinite if its mean is rounded. The squares of
    deviations below 1e-162 underflow to 0: x becomes infinite or NaN. The squares of deviations of
    1e154 and above overflow: sd is infinite and x becomes 0, or NaN if the sum of x overflows, too.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in all results. */
QX_API int32_t Norm1(QX_INOUT DBL1D x, QX_OUT double *mean, QX_OUT double *sd,
                     QX_OUT ErrorCode *err);
/** As Norm1, over all elements of a matrix. */
QX_API int32_t Norm2(QX_INOUT DBL2D x, QX_OUT double *mean, QX_OUT double *sd,
                     QX_OUT ErrorCode *err);

/** Replaces x by a x + b, which is infinite or NaN where that overflows. The function result is the
    code.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in some results; a, b in all results. */
QX_API ErrorCode Line1(QX_INOUT DBL1D x, QX_IN const double *a, QX_IN const double *b);
/** As Line1, for a matrix. */
QX_API ErrorCode LinEv(QX_INOUT DBL2D x, double a, double b);

/** Unwraps a phase in radians: from the second element on, each is moved by whole turns to within
    half a turn of the one before it, x[i] - floor((x[i] - x[i-1]) / P + 1/2) P. A difference that
    overflows makes the later elements infinite or NaN. The code is in *err and is the function
    result.
    Codes: ErrSizesDisagree (x is empty).
    NaN: x in all results or in some results. */
QX_API ErrorCode unWrap(QX_INOUT DBL1D x, QX_OUT ErrorCode *err);
/** As unWrap, with a choice of units. mode: 0 radians; 1 radians in and degrees out; 2 degrees; 3
    degrees in and radians out. Angles beyond 5e305 overflow if the unit changes. The code is the
    function result only.
    Codes: ErrSizesDisagree (x is empty), ErrInvalidSelector (any other mode). */
QX_API ErrorCode unWrap85(QX_INOUT DBL1D x, int32_t mode);

QX_END_DECLS

#endif
