#ifndef QX_INTERPOLATION_H
#define QX_INTERPOLATION_H

/* Reading values between the points of a table: by the polynomial through all of them, by a
   rational function through all of them, and by a cubic spline. The function result is 0 and the
   code stands in *err, unless noted. A failure makes numbers NaN and empties arrays.

   Differences, quotients and products that leave the range of numbers are not looked for: the
   result is then infinite or NaN, with the code 0. That takes values or slopes near 1e308,
   abscissae closer than about 1e-154 or farther apart than 1e100, or an *xi as far beyond the
   table. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The polynomial through the points (x, y) at *xi, by Neville's tableau. *dy is its last
    correction, an estimate of the error; 0 for a single point. Of the order of n^2 / 2 steps.
    E. H. Neville, "Iterative interpolation", 1934.
    Codes: ErrSizeMismatch (x and y differ in length), ErrEmptyInput (they are empty),
   ErrOutOfMemory (no scratch memory), ErrAbscissaeOrder (two abscissae are equal).
    NaN: y, x, xi in all results. */
QX_API int32_t PolyInterp_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN const double *xi,
                               QX_OUT double *yi, QX_OUT double *dy, QX_OUT ErrorCode *err);

/** As PolyInterp_head, by the diagonal rational function: R. Bulirsch and J. Stoer,
   "Fehlerabschaetzungen und Extrapolation mit rationalen Funktionen bei Verfahren vom
   Richardson-Typus", 1964. At a point of the table it gives y there, with *dy 0. In the tableau y
   is moved by 1e-10 against the quotient of zeros, so values of that size are not resolved. Codes:
   ErrSizeMismatch (x and y differ in length), ErrEmptyInput (they are empty), ErrOutOfMemory (no
   scratch memory), ErrDuplicateAbscissa (the function has a pole at *xi). */
QX_API int32_t RatInterp_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN const double *xi,
                              QX_OUT double *yi, QX_OUT double *dy, QX_OUT ErrorCode *err);

/** The second derivatives, at the points, of the cubic spline through (x, y) with the given slopes
   at its ends; a slope above 9.9e29, or NaN, asks for a second derivative of 0 there instead. x
   ascends or descends. A single point gives 0. Where the host refuses a resize its status is the
   function result. Codes: ErrSizeMismatch (x and y differ in length), ErrOutOfMemory (no memory),
   ErrEmptyInput (they are empty), ErrAbscissaeOrder (neighbouring abscissae, or the next but one,
   are equal).
    NaN: y, x in all results; firstSlope, lastSlope in no result. */
QX_API int32_t Spline_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN const double *firstSlope,
                           QX_IN const double *lastSlope, QX_OUT DBL1D secondDerivatives,
                           QX_OUT ErrorCode *err);

/** The cubic spline of Spline_head at *xi; beyond the table the end segment goes on.
    Codes: ErrSizeMismatch (the arrays differ in length, or a handle is null), ErrEmptyInput (they
   are empty), ErrAbscissaeOrder (the abscissae around *xi are equal, or there is one only).
    NaN: y, secondDerivatives in no result; x in all results or in no result; xi in all results. */
QX_API int32_t SpInterp_head(QX_IN DBL1D y, QX_IN DBL1D x, QX_IN DBL1D secondDerivatives,
                             QX_IN const double *xi, QX_OUT double *yi, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
