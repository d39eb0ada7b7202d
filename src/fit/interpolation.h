#ifndef QX_FIT_INTERPOLATION_H
#define QX_FIT_INTERPOLATION_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// A table of n points. include/qx/interpolation.h tells what they compute and their codes.
struct Table {
    const DBL *x;
    const DBL *y;
    int32_t n;
};
ErrorCode InterpolateByPolynomial(const Table &table, double xi, double *yi, double *dy);
ErrorCode InterpolateByRational(const Table &table, double xi, double *yi, double *dy);
ErrorCode SplineSecondDerivatives(const Table &table, double firstSlope, double lastSlope, DBL *s);
ErrorCode InterpolateBySpline(const Table &table, const DBL *s, double xi, double *yi);

} // namespace qx

#endif
