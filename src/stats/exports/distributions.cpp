#include "qx/distributions.h"

#include "frame/finish.h"
#include "stats/distributions.h"

int32_t NormDist_head(const DBL *x, DBL *p) { return qx::NormalCDF(*x, p); }

int32_t TDist_head(const DBL *t, const int32_t *dof, DBL *p, ErrorCode *err) {
    return qx::Report(err, qx::StudentCDF(*t, *dof, p), p);
}

int32_t FDist_head(const DBL *f, const int32_t *n, const int32_t *d, DBL *p, ErrorCode *err) {
    return qx::Report(err, qx::FisherCDF(*f, *n, *d, p), p);
}

int32_t ChiSquare_head(const DBL *x, const int32_t *dof, DBL *p, ErrorCode *err) {
    return qx::Report(err, qx::ChiSquareCDF(*x, *dof, p), p);
}

int32_t InvNdist_head(const DBL *p, DBL *x, ErrorCode *err) {
    return qx::Report(err, qx::NormalQuantile(*p, x), x);
}

int32_t InvTdist_head(const DBL *p, const int32_t *dof, DBL *t, ErrorCode *err) {
    return qx::Report(err, qx::StudentQuantile(*p, *dof, t), t);
}

int32_t InvFDist_head(const DBL *p, const int32_t *n, const int32_t *d, DBL *f, ErrorCode *err) {
    return qx::Report(err, qx::FisherQuantile(*p, *n, *d, f), f);
}

int32_t InvChiSquare_head(const DBL *p, const int32_t *dof, DBL *x, ErrorCode *err) {
    return qx::Report(err, qx::ChiSquareQuantile(*p, *dof, x), x);
}
