#include "stats/distributions.h"

#include "frame/export.h"
#include "qx/distributions.h"

namespace qx {
namespace {

// A distribution or an inverse without a parameter, with one, with two.
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
