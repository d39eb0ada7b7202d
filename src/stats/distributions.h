#ifndef QX_STATS_DISTRIBUTIONS_H
#define QX_STATS_DISTRIBUTIONS_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// Cumulative distribution functions and their inverses. Too few degrees of freedom give
// ErrTooFewForParameters, a probability outside [0, 1] gives ErrProbabilityOutOfRange, and NaN as t
// or f gives ErrNaNInData; in these cases the value is not written.

// Abramowitz and Stegun, 26.2.16; absolute error about 1e-5, deliberately not improved.
ErrorCode NormalCDF(double x, DBL *p);
ErrorCode StudentCDF(double t, int32_t dof, DBL *p);
ErrorCode FisherCDF(double f, int32_t n, int32_t d, DBL *p);
// dof may be 0, which gives NaN for positive x.
ErrorCode ChiSquareCDF(double x, int32_t dof, DBL *p);

// Abramowitz and Stegun, 26.2.23; absolute error about 4.5e-4, deliberately not improved.
ErrorCode NormalQuantile(double p, DBL *x);
// Bisection with an absolute tolerance of 1e-4: for t in [-10000, 10000], for f in [1e-6, 10000],
// for x in [0, 5000 k] with the first k that is large enough. Results outside are limited to these
// ranges.
ErrorCode StudentQuantile(double p, int32_t dof, DBL *t);
ErrorCode FisherQuantile(double p, int32_t n, int32_t d, DBL *f);
ErrorCode ChiSquareQuantile(double p, int32_t dof, DBL *x);

} // namespace qx

#endif
