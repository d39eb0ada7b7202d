#ifndef QX_ORDER_STATISTICS_H
#define QX_ORDER_STATISTICS_H

/* Median and mode.

   Unless noted the function result is 0 and the code stands in *err; a failure sets a numeric
   result to NaN and empties arrays. Input arrays are never changed. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Median: the middle value, or the mean of the two middle values.
    Codes: ErrEmptyInput (x is empty), ErrNaNInData (x contains NaN), ErrOutOfMemory (no scratch
    memory).
    NaN: x refused with ErrNaNInData. */
QX_API int32_t Median_head(QX_IN DBL1D x, QX_OUT DBL *median, QX_OUT ErrorCode *err);

/** The most frequent values of x in ascending order. With `intervals` above 0 the centres of the
    fullest of so many bins of equal width, which takes time in proportion to their number but
    memory only to that of the samples; otherwise the values that occur most often, equal within a
    relative distance of 2.22e-16. Empty for a single sample and where nothing occurs twice. The
    code is the function result.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no scratch memory, more than 268435455
    intervals, or the host refused the resize).
    NaN: x in no result. */
QX_API ErrorCode ModeH(QX_IN DBL1D x, int32_t intervals, QX_OUT DBL1D modes);

QX_END_DECLS

#endif
