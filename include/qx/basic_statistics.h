#ifndef QX_BASIC_STATISTICS_H
#define QX_BASIC_STATISTICS_H

/* Mean, mean square and moments.

   Unless noted otherwise, the function result is 0 and the code is in *err; a failure sets a
   numeric result to NaN and empties arrays. Input arrays are never changed.

   Sums, squares and powers are not protected against overflow: where one exceeds the largest
   double, 1.8e308, the result is infinite, or NaN if infinities of both signs are added, with the
   code 0. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Arithmetic mean, sum(x) / n, summed from the first element to the last.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in all results. */
QX_API int32_t Mean_head(QX_IN DBL1D x, QX_OUT DBL *mean, QX_OUT ErrorCode *err);

/** Root mean square, sqrt(sum(x^2) / n). The squares of values of 1.4e154 and above overflow, and
    those of values below 1.5e-162 underflow to 0; digits are lost for values below 1e-154.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in all results. */
QX_API int32_t RMS_head(QX_IN DBL1D x, QX_OUT DBL *rms, QX_OUT ErrorCode *err);

/** Root mean square of complex values, sqrt(sum(im^2 + re^2) / n), with the limits of RMS_head. The
    code is the function result.
    Codes: ErrEmptyInput (z is empty).
    NaN: z in all results. */
QX_API ErrorCode CxRMS_head(QX_IN CDB1D z, QX_OUT DBL *rms);

/** Mean squared difference over the shorter of the two lengths, m: sum(x x + y (y - 2 x)) / m.
    Where x and y nearly agree, the sum loses digits to cancellation. For values of 1e154 and above,
    the products overflow; the result is then NaN if y is about as large as x, however small the
    difference.
    Codes: ErrEmptyInput (x or y is empty), WarnLengthsDiffer (the lengths differ).
    NaN: x in all results; y in all results or in no result. */
QX_API int32_t MSE_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_OUT DBL *mse, QX_OUT ErrorCode *err);

/** Central population moment, sum((x - mean)^order) / n; order 2 is the population variance. A
    power beyond the range of double is infinite, small powers underflow to 0, and the sum is NaN if
    an odd order gives infinities of both signs.
    Codes: ErrEmptyInput (x is empty), ErrOrderNotPositive (the order is below 1).
    NaN: x in all results. */
QX_API int32_t Moment_head(QX_IN DBL1D x, QX_IN const int32_t *order, QX_OUT DBL *moment,
                           QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
