#include "qx/stats.h"

#include "frame/finish.h"
#include "frame/views.h"
#include "stats/basic.h"

namespace {

using DBLIn = qx::In1D<qx::ElementType::DBL>;
using CDBIn = qx::In1D<qx::ElementType::CDB>;

} // namespace

int32_t Mean_head(DBL1D x, DBL *mean, ErrorCode *err) {
    const DBLIn in(x);
    return qx::Report(err, qx::ArrayMean(in.data(), in.size(), mean), mean);
}

int32_t RMS_head(DBL1D x, DBL *rms, ErrorCode *err) {
    const DBLIn in(x);
    return qx::Report(err, qx::ArrayRMS(in.data(), in.size(), rms), rms);
}

ErrorCode CxRMS_head(CDB1D z, DBL *rms) {
    const CDBIn in(z);
    return qx::ArrayCxRMS(in.data(), in.size(), rms);
}

int32_t MSE_head(DBL1D x, DBL1D y, DBL *mse, ErrorCode *err) {
    const DBLIn first(x);
    const DBLIn second(y);
    return qx::Report(
        err, qx::ArrayMSE(first.data(), first.size(), second.data(), second.size(), mse), mse);
}

int32_t Moment_head(DBL1D x, const int32_t *order, DBL *moment, ErrorCode *err) {
    const DBLIn in(x);
    return qx::Report(err, qx::ArrayMoment(in.data(), in.size(), *order, moment), moment);
}
