#ifndef QX_FIT_INTERPOLATION_H
#define QX_FIT_INTERPOLATION_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// A table of at least one point, as many x as y. include/qx/interpolation.h documents what is
// computed and the codes.
struct Table {
    ConstRealVector x, y;
    int32_t n() const { return static_cast<int32_t>(x.size()); }
};
ErrorCode InterpolateByPolynomial(const Table &table, double xi, double *yi, double *dy);
ErrorCode InterpolateByRational(const Table &table, double xi, double *yi, double *dy);
ErrorCode SplineSecondDerivatives(const Table &table, double firstSlope, double lastSlope,
                                  RealVector s);
ErrorCode InterpolateBySpline(const Table &table, ConstRealVector s, double xi, double *yi);

} // namespace qx

#endif
