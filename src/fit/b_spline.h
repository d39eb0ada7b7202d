#ifndef QX_FIT_B_SPLINE_H
#define QX_FIT_B_SPLINE_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// The clamped knots of a spline on the ascending x: degree + 1 at either end and `interior` between
// them, from `given` or, where that is null, at the quantiles (i + 1) / (interior + 1) of x.
void MakeKnots(const DBL *x, int32_t n, int32_t degree, int32_t interior, const DBL *given,
               DBL *knots);

// The least-squares spline with these knots, `count` coefficients, count <= n, degree <= 9. values
// gets its values and *mse the sum of |w| (y - value)^2 over n. w may be null.
//
// ErrPolynomialOrderTooHigh (a matrix without full rank), ErrOutOfMemory.
ErrorCode FitBSpline(const DBL *x, const DBL *y, const DBL *w, int32_t n, int32_t degree,
                     const DBL *knots, int32_t count, DBL *coefficients, DBL *values, DBL *mse);

} // namespace qx

#endif
