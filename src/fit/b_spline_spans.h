#ifndef QX_FIT_B_SPLINE_SPANS_H
#define QX_FIT_B_SPLINE_SPANS_H

#include "frame/widths.h"
#include "qx/types.h"

namespace qx {

constexpr int32_t kHighestSplineDegree = 9;
// The number of rows that are reduced at once: they and their columns stay in the first cache.
constexpr int32_t kSplineRows = 256;

// Samples within one span between two knots; w may be null.
struct SpanSamples {
    const DBL *x, *y, *w;
    int32_t count;
};

// The loops over the samples of a span, which ends at knots[1] and begins at knots[0]; knots of
// `degree` spans on either side are read. All sums use four partial sums, sample i in sum i mod 4,
// which are added pairwise.

// Reduces the rows sqrt(|w|) scale B(x), with the target sqrt(|w|) scale y, against the first
// degree + 1 rows of an upper triangle by reflections (A. S. Householder, 1958). Row i of the
// triangle, at triangle + i (degree + 2), begins with its diagonal element and ends with the
// target. work: kSplineRows (degree + 2) elements. At most kSplineRows samples.
QX_BY_WIDTH(void, ReduceSpan,
            (const SpanSamples *samples, const DBL *knots, int32_t degree, double scale,
             DBL *triangle, DBL *work))

// values = sum of coefficients[j] B_j(x), degree + 1 terms; squares[0..3] += |w| (y - value)^2.
QX_BY_WIDTH(void, EvaluateSpan,
            (const SpanSamples *samples, const DBL *knots, int32_t degree, const DBL *coefficients,
             DBL *values, DBL *squares))

} // namespace qx

#endif
