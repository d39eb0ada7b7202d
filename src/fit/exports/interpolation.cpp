#include "fit/interpolation.h"

#include "frame/export.h"
#include "qx/interpolation.h"

namespace qx {
namespace {

template <ErrorCode (*Interpolate)(const Table &, double, double *, double *)>
ErrorCode Interpolated(In<DBL1D> y, In<DBL1D> x, double xi, OutDBL yi, OutDBL dy) {
    if (const ErrorCode bad =
            FirstFailed({{x.size() != y.size(), ErrSizeMismatch}, {x.isEmpty(), ErrEmptyInput}}))
        return bad;
    return Interpolate({x.view(), y.view()}, xi, yi.address(), dy.address());
}

Outcome Spline(In<DBL1D> y, In<DBL1D> x, double firstSlope, double lastSlope,
               Out<DBL1D> secondDerivatives) {
    if (x.size() != y.size())
        return ErrSizeMismatch;
    if (const Outcome bad = secondDerivatives.resize(x.size()))
        return bad;
    if (x.isEmpty())
        return ErrEmptyInput;
    return SplineSecondDerivatives({x.view(), y.view()}, firstSlope, lastSlope,
                                   secondDerivatives.view());
}

// The only export that accepts null handles.
ErrorCode SplineValue(DBL1D y, DBL1D x, DBL1D secondDerivatives, double xi, OutDBL yi) {
    if (y == nullptr || x == nullptr || secondDerivatives == nullptr)
        return ErrSizeMismatch;
    const In<DBL1D> values(y);
    const In<DBL1D> points(x);
    const In<DBL1D> bends(secondDerivatives);
    if (points.size() != values.size() || points.size() != bends.size())
        return ErrSizeMismatch;
    if (points.isEmpty())
        return ErrEmptyInput;
    return InterpolateBySpline({points.view(), values.view()}, bends.view(), xi, yi.address());
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::InErrWithHost;

int32_t PolyInterp_head(DBL1D y, DBL1D x, const double *xi, double *yi, double *dy,
                        ErrorCode *err) {
    return InErr(err, qx::Interpolated<qx::InterpolateByPolynomial>, y, x, *xi, yi, dy);
}

int32_t RatInterp_head(DBL1D y, DBL1D x, const double *xi, double *yi, double *dy, ErrorCode *err) {
    return InErr(err, qx::Interpolated<qx::InterpolateByRational>, y, x, *xi, yi, dy);
}

int32_t Spline_head(DBL1D y, DBL1D x, const double *firstSlope, const double *lastSlope,
                    DBL1D secondDerivatives, ErrorCode *err) {
    return InErrWithHost(err, qx::Spline, y, x, *firstSlope, *lastSlope, secondDerivatives);
}

int32_t SpInterp_head(DBL1D y, DBL1D x, DBL1D secondDerivatives, const double *xi, double *yi,
                      ErrorCode *err) {
    return InErr(err, qx::SplineValue, y, x, secondDerivatives, *xi, yi);
}
