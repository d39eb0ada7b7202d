#ifndef QX_ORDER_STATISTICS_H
#define QX_ORDER_STATISTICS_H

/* Median and mode.

   Unless noted otherwise, the function result is 0 and the code is in *err; a failure sets a
   numeric result to NaN and empties arrays. Input arrays are never changed. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Median: the middle value, or the mean of the two middle values.
    Codes: ErrEmptyInput (x is empty), ErrNaNInData (x contains NaN), ErrOutOfMemory (no scratch
    memory).
    NaN: x refused with ErrNaNInData. */
QX_API int32_t Median_head(QX_IN DBL1D x, QX_OUT DBL *median, QX_OUT ErrorCode *err);

/** The most frequent values of x in ascending order. If `intervals` is above 0, these are the
    centres of the fullest among that many bins of equal width; the time is proportional to the
    number of bins, the memory only to the number of samples. Otherwise they are the values that
    occur most often, where values count as equal within a relative distance of 2.22e-16. The result
    is empty for a single sample and if no value occurs twice. The code is the function result.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no scratch memory, more than 268435455
    intervals, or the host refused the resize).
    NaN: x skipped. */
QX_API ErrorCode ModeH(QX_IN DBL1D x, int32_t intervals, QX_OUT DBL1D modes);

QX_END_DECLS

#endif
