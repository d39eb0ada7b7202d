#ifndef QX_INTERPOLATION_H
#define QX_INTERPOLATION_H

/* Interpolation between the points of a table: by the polynomial through all points, by a rational
   function through all points, and by a cubic spline. Unless noted otherwise, the function result
   is 0 and the code is in *err. A failure sets numbers to NaN and empties arrays.

   Overflow of differences, quotients and products is not checked for: the result is then infinite
   or NaN, with the code 0. This happens only for values or slopes near 1e308, for abscissae closer
   than about 1e-154 or farther apart than 1e100, or for an *xi that far beyond the table. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The polynomial through the points (x, y) at *xi, by Neville's tableau. *dy is its last
    correction, an estimate of the error; 0 for a single point. The time is about n^2 / 2 steps. E.
    H. Neville, "Iterative interpolation", 1934.
    Codes: ErrSizeMismatch (x and y differ in length), ErrEmptyInput (they are empty),
    ErrOutOfMemory (no scratch memory), ErrAbscissaeOrder (two abscissae are equal).
    NaN: y, x, xi in all results. */
QX_API int32_t PolyInterp_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN const double *xi,
                               QX_OUT double *yi, QX_OUT double *dy, QX_OUT ErrorCode *err);

/** As PolyInterp_head, by the diagonal rational function: R. Bulirsch and J. Stoer,
    "Fehlerabschaetzungen und Extrapolation mit rationalen Funktionen bei Verfahren vom
    Richardson-Typus", 1964. At a point of the table, *yi is the y of that point, and *dy is 0. The
    tableau adds 1e-10 to y to avoid quotients of zeros, so values of that size are not resolved.
    Codes: ErrSizeMismatch (x and y differ in length), ErrEmptyInput (they are empty),
    ErrOutOfMemory (no scratch memory), ErrDuplicateAbscissa (the function has a pole at *xi). */
QX_API int32_t RatInterp_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN const double *xi,
                              QX_OUT double *yi, QX_OUT double *dy, QX_OUT ErrorCode *err);

/** The second derivatives, at the points, of the cubic spline through (x, y) with the given slopes
    at its ends; a slope above 9.9e29, or NaN, selects a second derivative of 0 there instead. x
    ascends or descends. A single point gives 0. If the host refuses a resize, its status is the
    function result.
    Codes: ErrSizeMismatch (x and y differ in length), ErrOutOfMemory (no memory), ErrEmptyInput
    (they are empty), ErrAbscissaeOrder (two abscissae that are adjacent, or separated by one other,
    are equal).
    NaN: y, x in all results; firstSlope, lastSlope in no result. */
QX_API int32_t Spline_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN const double *firstSlope,
                           QX_IN const double *lastSlope, QX_OUT DBL1D secondDerivatives,
                           QX_OUT ErrorCode *err);

/** The cubic spline of Spline_head at *xi; beyond the table the first or last segment is
    extrapolated.
    Codes: ErrSizeMismatch (the arrays differ in length, or a handle is null), ErrEmptyInput (they
    are empty), ErrAbscissaeOrder (the abscissae around *xi are equal, or there is only one).
    NaN: y, x, secondDerivatives in all results or in no result; xi in all results. */
QX_API int32_t SpInterp_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D secondDerivatives,
                             QX_IN const double *xi, QX_OUT double *yi, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
