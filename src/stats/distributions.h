#ifndef QX_STATS_DISTRIBUTIONS_H
#define QX_STATS_DISTRIBUTIONS_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// Cumulative distribution functions and their inverses. Degrees of freedom that are too few give
// ErrTooFewForParameters, a probability outside [0, 1] ErrProbabilityOutOfRange, a NaN as t or f
// ErrNaNInData; the value is then not written.

// Abramowitz and Stegun, 26.2.16; absolute error about 1e-5, on purpose not improved.
ErrorCode NormalCDF(double x, DBL *p);
ErrorCode StudentCDF(double t, int32_t dof, DBL *p);
ErrorCode FisherCDF(double f, int32_t n, int32_t d, DBL *p);
// dof may be 0, which gives NaN for x above 0.
ErrorCode ChiSquareCDF(double x, int32_t dof, DBL *p);

// Abramowitz and Stegun, 26.2.23; absolute error about 4.5e-4, on purpose not improved.
ErrorCode NormalQuantile(double p, DBL *x);
// Bisections with an absolute tolerance of 1e-4: of t in [-10000, 10000], of f in [1e-6, 10000],
// of x in [0, 5000 k] for the first k that serves. Answers outside saturate.
ErrorCode StudentQuantile(double p, int32_t dof, DBL *t);
ErrorCode FisherQuantile(double p, int32_t n, int32_t d, DBL *f);
ErrorCode ChiSquareQuantile(double p, int32_t dof, DBL *x);

} // namespace qx

#endif
