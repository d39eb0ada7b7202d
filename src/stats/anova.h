#ifndef QX_STATS_ANOVA_H
#define QX_STATS_ANOVA_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// Pearson's test of independence on a table of counts. NaN if a row or a column is empty.
// ErrTableTooSmall, ErrTableNegativeSize (a cell), ErrOutOfMemory.
ErrorCode ContingencyTest(const ConstMatrixView<ElementType::I32> &table, DBL *chiSquare, DBL *p);

struct OneWayTable {
    double ssBetween, msBetween, f, p, ssError, msError, ssTotal, fCritical;
};

// One-way analysis of variance of observations with integer labels, one label per observation, on k
// levels.
// kept: the sums of squares are differences of large sums from a single pass. With a mean of m
// standard deviations about 2 log10(m) of the sixteen digits are lost, and ssError can come out
// slightly negative.
// ErrAnovaFewLevels, ErrBadSignificance, ErrOutOfMemory, ErrAnovaFactorEmpty (more labels than
// k), ErrAnovaNoReplication (fewer).
ErrorCode OneWayAnova(ConstRealVector y, ConstVectorView<ElementType::I32> labels, int32_t k,
                      double alpha, OneWayTable *result);

// The revisions. The statistic is computed from exact O total - (row sum)(column sum), in twice the
// precision, and its probability from the upper tail.
ErrorCode ContingencyTail(const ConstMatrixView<ElementType::I32> &table, DBL *chiSquare, DBL *p);

// Two passes over differences to one observation, of data scaled by a power of 2, in twice the
// precision: the sums of squares are the exact ones, rounded. A sum of squares below 2^-90 of that
// of the differences is set to 0, which is its true value.
ErrorCode OneWayAnovaByDifferences(ConstRealVector y, ConstVectorView<ElementType::I32> labels,
                                   int32_t k, double alpha, OneWayTable *result);

} // namespace qx

#endif
