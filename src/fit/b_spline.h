#ifndef QX_FIT_B_SPLINE_H
#define QX_FIT_B_SPLINE_H

#include "fit/samples.h"
#include "qx/errors.h"

namespace qx {

// The clamped knots of a spline on the ascending x, degree + 1 at either end and the interior ones
// between them: `given`, or, if that is empty, as many as `knots` has room for, at the quantiles (i
// + 1) / (interior + 1) of x.
void MakeKnots(ConstRealVector x, int32_t degree, ConstRealVector given, RealVector knots);

// The least-squares spline with these knots, its values and *out.mse, the sum of |w| (y - value)^2
// divided by n. There may be no more coefficients than samples, and the degree is at most 9.
//
// ErrPolynomialOrderTooHigh (the matrix lacks full rank), ErrOutOfMemory.
ErrorCode FitBSpline(const FitSamples &samples, int32_t degree, ConstRealVector knots,
                     RealVector coefficients, const FitOutput &out);

} // namespace qx

#endif
