#ifndef QX_STATS_H
#define QX_STATS_H

/* Basic statistics, histograms, order statistics and mode.

   Unless noted the function result is 0 and the code stands in *err; a failure sets a numeric
   result to NaN and empties arrays. Input arrays are never changed. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Arithmetic mean, sum(x) / n, summed from the first element to the last.
    Codes: ErrEmptyInput (x is empty). */
QX_API int32_t Mean_head(QX_IN DBL1D x, QX_OUT DBL *mean, QX_OUT ErrorCode *err);

/** Root mean square, sqrt(sum(x^2) / n). The squares may overflow.
    Codes: ErrEmptyInput (x is empty). */
QX_API int32_t RMS_head(QX_IN DBL1D x, QX_OUT DBL *rms, QX_OUT ErrorCode *err);

/** Root mean square of complex values, sqrt(sum(im^2 + re^2) / n). The code is the function result.
    Codes: ErrEmptyInput (z is empty). */
QX_API ErrorCode CxRMS_head(QX_IN CDB1D z, QX_OUT DBL *rms);

/** Mean squared difference over the shorter length m, sum(x x + y (y - 2 x)) / m. Where x and y
    nearly agree the sum loses digits to cancellation.
    Codes: ErrEmptyInput (x or y is empty), WarnLengthsDiffer (the lengths differ). */
QX_API int32_t MSE_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_OUT DBL *mse, QX_OUT ErrorCode *err);

/** Central population moment, sum((x - mean)^order) / n; order 2 is the population variance.
    Codes: ErrEmptyInput (x is empty), ErrOrderNotPositive (the order is below 1). */
QX_API int32_t Moment_head(QX_IN DBL1D x, QX_IN const int32_t *order, QX_OUT DBL *moment,
                           QX_OUT ErrorCode *err);

/** Histogram of x over its own range in *bins bins of equal width, with their centres. The maximum
    counts in the last bin; NaN counts nowhere. A constant array stands in the last bin, and every
    centre equals its value. Where the host refuses a resize its status is the function result.
    Codes: ErrEmptyInput (x is empty or there are no bins), ErrOutOfMemory (the host refused a
    resize). */
QX_API int32_t histgran_head(QX_IN DBL1D x, QX_IN const int32_t *bins, QX_OUT I32_1D counts,
                             QX_OUT DBL1D centres, QX_OUT ErrorCode *err);

/* An interval of GenHistH. `closure` tells which ends belong to it: 0 the lower, 1 the upper,
   2 both, 3 none; above 3 every x lies inside. */
typedef struct HistInterval {
    double lower;
    double upper;
    int32_t closure;
} HistInterval;

/* An array of HistInterval: a one-dimensional block of records. */
typedef QX_ARRAY_1D(HistInterval) HistInterval1D;

typedef struct HistSummary {
    int32_t outside; /* samples in no interval */
    int32_t below;   /* of these, below the first interval */
    int32_t above;   /* of these, above the last interval */
} HistSummary;

/** Counts the samples of x in each of the caller's intervals, which are expected in ascending
    order. A sample counts in every interval that it lies in. After a failure the summary is 0.
    Codes: ErrSizesDisagree (the number of intervals is negative), ErrOutOfMemory (no memory),
    ErrEmptyInput (x is empty). */
QX_API int32_t GenHistH(QX_IN DBL1D x, QX_IN HistInterval1D intervals, QX_OUT I32_1D counts,
                        QX_OUT HistSummary *summary, QX_OUT ErrorCode *err);

/** Median: the middle value, or the mean of the two middle values.
    Codes: ErrEmptyInput (x is empty), ErrNaNInData (x contains NaN), ErrOutOfMemory (no scratch
    memory). */
QX_API int32_t Median_head(QX_IN DBL1D x, QX_OUT DBL *median, QX_OUT ErrorCode *err);

/** The most frequent values of x in ascending order. With `intervals` above 0 the centres of the
    fullest of so many bins of equal width; otherwise the values that occur most often, equal within
    a relative distance of 2.22e-16. Empty for a single sample and where nothing occurs twice. The
    code is the function result.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no scratch memory or the host refused the
    resize). */
QX_API ErrorCode ModeH(QX_IN DBL1D x, int32_t intervals, QX_OUT DBL1D modes);

QX_END_DECLS

#endif
