#include "stats/distributions.h"

#include "frame/export.h"
#include "qx/distributions.h"
#include "stats/tail_distributions.h"

#include <cmath>

namespace qx {
namespace {

// A distribution or an inverse with no parameter, with one, or with two.
template <auto Function>
ErrorCode Plain(double at, OutDBL value) {
    return Function(at, value.address());
}
template <auto Function>
ErrorCode WithDegrees(double at, int32_t dof, OutDBL value) {
    return Function(at, dof, value.address());
}
template <auto Function>
ErrorCode WithTwoDegrees(double at, int32_t n, int32_t d, OutDBL value) {
    return Function(at, n, d, value.address());
}

// The checks of the distributions that return any of the values, and of their inverses in either
// tail.
template <auto Function, class... Degrees>
ErrorCode Chosen(double at, int32_t what, OutDBL value, Degrees... degrees) {
    if (what < 0 || what > static_cast<int32_t>(DistributionValue::Density))
        return ErrInvalidSelector;
    if ((... || !(degrees > 0.0)))
        return ErrTooFewForParameters;
    if (std::isnan(at))
        return ErrNaNInData;
    value = Function(at, degrees..., static_cast<DistributionValue>(what));
    return 0;
}
template <auto Function, class... Degrees>
ErrorCode Point(double p, int32_t tail, OutDBL value, Degrees... degrees) {
    if (tail != 0 && tail != 1)
        return ErrInvalidSelector;
    if ((... || !(degrees > 0.0)))
        return ErrTooFewForParameters;
    if (!(p >= 0.0 && p <= 1.0))
        return ErrProbabilityOutOfRange;
    value = Function(p, tail == 1, degrees...);
    return 0;
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

int32_t NormDist_head(const DBL *x, DBL *p) { return Returned(qx::Plain<qx::NormalCDF>, *x, p); }

int32_t TDist_head(const DBL *t, const int32_t *dof, DBL *p, ErrorCode *err) {
    return InErr(err, qx::WithDegrees<qx::StudentCDF>, *t, *dof, p);
}

int32_t FDist_head(const DBL *f, const int32_t *n, const int32_t *d, DBL *p, ErrorCode *err) {
    return InErr(err, qx::WithTwoDegrees<qx::FisherCDF>, *f, *n, *d, p);
}

int32_t ChiSquare_head(const DBL *x, const int32_t *dof, DBL *p, ErrorCode *err) {
    return InErr(err, qx::WithDegrees<qx::ChiSquareCDF>, *x, *dof, p);
}

int32_t InvNdist_head(const DBL *p, DBL *x, ErrorCode *err) {
    return InErr(err, qx::Plain<qx::NormalQuantile>, *p, x);
}

int32_t InvTdist_head(const DBL *p, const int32_t *dof, DBL *t, ErrorCode *err) {
    return InErr(err, qx::WithDegrees<qx::StudentQuantile>, *p, *dof, t);
}

int32_t InvFDist_head(const DBL *p, const int32_t *n, const int32_t *d, DBL *f, ErrorCode *err) {
    return InErr(err, qx::WithTwoDegrees<qx::FisherQuantile>, *p, *n, *d, f);
}

int32_t InvChiSquare_head(const DBL *p, const int32_t *dof, DBL *x, ErrorCode *err) {
    return InErr(err, qx::WithDegrees<qx::ChiSquareQuantile>, *p, *dof, x);
}

int32_t NormDist2026_head(const DBL *x, const int32_t *what, DBL *value, ErrorCode *err) {
    return InErr(err, qx::Chosen<qx::NormalValue>, *x, *what, value);
}

int32_t TDist2026_head(const DBL *t, const DBL *dof, const int32_t *what, DBL *value,
                       ErrorCode *err) {
    return InErr(err, qx::Chosen<qx::StudentValue, double>, *t, *what, value, *dof);
}

int32_t FDist2026_head(const DBL *f, const DBL *n, const DBL *d, const int32_t *what, DBL *value,
                       ErrorCode *err) {
    return InErr(err, qx::Chosen<qx::FisherValue, double, double>, *f, *what, value, *n, *d);
}

int32_t ChiSquare2026_head(const DBL *x, const DBL *dof, const int32_t *what, DBL *value,
                           ErrorCode *err) {
    return InErr(err, qx::Chosen<qx::ChiSquareValue, double>, *x, *what, value, *dof);
}

int32_t InvNdist2026_head(const DBL *p, const int32_t *tail, DBL *x, ErrorCode *err) {
    return InErr(err, qx::Point<qx::NormalPoint>, *p, *tail, x);
}

int32_t InvTdist2026_head(const DBL *p, const int32_t *tail, const DBL *dof, DBL *t,
                          ErrorCode *err) {
    return InErr(err, qx::Point<qx::StudentPoint, double>, *p, *tail, t, *dof);
}

int32_t InvFDist2026_head(const DBL *p, const int32_t *tail, const DBL *n, const DBL *d, DBL *f,
                          ErrorCode *err) {
    return InErr(err, qx::Point<qx::FisherPoint, double, double>, *p, *tail, f, *n, *d);
}

int32_t InvChiSquare2026_head(const DBL *p, const int32_t *tail, const DBL *dof, DBL *x,
                              ErrorCode *err) {
    return InErr(err, qx::Point<qx::ChiSquarePoint, double>, *p, *tail, x, *dof);
}
