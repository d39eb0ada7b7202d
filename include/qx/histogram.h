#ifndef QX_HISTOGRAM_H
#define QX_HISTOGRAM_H

/* Histograms: samples counted in bins and in intervals.

   Unless noted otherwise, the function result is 0 and the code is in *err; a failure sets a
   numeric result to NaN and empties arrays. Input arrays are never changed. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Histogram of x over its own range in *bins bins of equal width, with their centres. The maximum
    counts in the last bin; NaN is not counted. The samples of a constant array all count in the
    last bin, here with those that are NaN, and every centre equals their value. If the host refuses
    a resize, its status is the function result. Memory and time grow with the number of bins (12
    bytes each), however few samples there are.
    Codes: ErrEmptyInput (x is empty or there are no bins), ErrOutOfMemory (the host refused a
    resize).
    NaN: x skipped. */
QX_API int32_t histgran_head(QX_IN DBL1D x, QX_IN const int32_t *bins, QX_OUT I32_1D counts,
                             QX_OUT DBL1D centres, QX_OUT ErrorCode *err);

/* An interval of GenHistH. `closure` selects the ends that belong to it: 0 the lower end, 1 the
   upper end, 2 both, 3 neither; above 3 every x lies inside. */
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

/** Counts the samples of x in each of the given intervals, which are expected in ascending order. A
    sample counts in every interval that contains it; NaN is in none and counts as above the last
    one. After a failure the summary is 0.
    Codes: ErrSizesDisagree (the number of intervals is negative), ErrOutOfMemory (no memory),
    ErrEmptyInput (x is empty).
    NaN: x in no result. */
QX_API int32_t GenHistH(QX_IN DBL1D x, QX_IN HistInterval1D intervals, QX_OUT I32_1D counts,
                        QX_OUT HistSummary *summary, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
