#ifndef QX_STATS_ANOVA_H
#define QX_STATS_ANOVA_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// Pearson's test of independence on a table of counts, rows by cols, row by row. NaN where a row
// or a column is empty. ErrTableNegativeSize (a dimension), ErrTableTooSmall,
// ErrTableNegativeSize (a cell), ErrOutOfMemory.
ErrorCode ContingencyTest(const I32 *table, int32_t rows, int32_t cols, DBL *chiSquare, DBL *p);

struct OneWayTable {
    double ssBetween, msBetween, f, p, ssError, msError, ssTotal, fCritical;
};

// One-way analysis of variance of n observations with integer labels on k levels.
// kept: the sums of squares are differences of large sums from a single pass. With a mean of m
// standard deviations about 2 log10(m) of the sixteen digits are lost, and ssError can come out
// slightly negative.
// ErrAnovaFewLevels, ErrBadSignificance, ErrOutOfMemory, ErrAnovaFactorEmpty (more labels than
// k), ErrAnovaNoReplication (fewer).
ErrorCode OneWayAnova(const DBL *y, const I32 *labels, int32_t n, int32_t k, double alpha,
                      OneWayTable *result);

} // namespace qx

#endif
