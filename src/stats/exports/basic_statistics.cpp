#include "stats/basic.h"

#include "frame/export.h"
#include "qx/basic_statistics.h"

namespace qx {
namespace {

ErrorCode Mean(In<DBL1D> x, OutDBL mean) { return ArrayMean(x.view(), mean.address()); }
ErrorCode RMS(In<DBL1D> x, OutDBL rms) { return ArrayRMS(x.view(), rms.address()); }
ErrorCode CxRMS(In<CDB1D> z, OutDBL rms) { return ArrayCxRMS(z.view(), rms.address()); }
ErrorCode MSE(In<DBL1D> x, In<DBL1D> y, OutDBL mse) {
    return ArrayMSE(x.view(), y.view(), mse.address());
}
ErrorCode Moment(In<DBL1D> x, int32_t order, OutDBL moment) {
    return ArrayMoment(x.view(), order, moment.address());
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

int32_t Mean_head(DBL1D x, DBL *mean, ErrorCode *err) { return InErr(err, qx::Mean, x, mean); }

int32_t RMS_head(DBL1D x, DBL *rms, ErrorCode *err) { return InErr(err, qx::RMS, x, rms); }

ErrorCode CxRMS_head(CDB1D z, DBL *rms) { return Returned(qx::CxRMS, z, rms); }

int32_t MSE_head(DBL1D x, DBL1D y, DBL *mse, ErrorCode *err) {
    return InErr(err, qx::MSE, x, y, mse);
}

int32_t Moment_head(DBL1D x, const int32_t *order, DBL *moment, ErrorCode *err) {
    return InErr(err, qx::Moment, x, *order, moment);
}
