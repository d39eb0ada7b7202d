#include "qx/stats.h"

#include "frame/finish.h"
#include "frame/scratch.h"
#include "frame/views.h"
#include "stats/mode.h"
#include "stats/order.h"

#include <cstring>

namespace {

using DBLIn = qx::In1D<qx::ElementType::DBL>;
using DBLOut = qx::Out1D<qx::ElementType::DBL>;

} // namespace

int32_t Median_head(DBL1D x, DBL *median, ErrorCode *err) {
    const DBLIn in(x);
    return qx::Report(err, qx::ArrayMedian(in.data(), in.size(), median), median);
}

ErrorCode ModeH(DBL1D x, int32_t intervals, DBL1D modes) {
    const DBLIn in(x);
    const DBLOut out(modes);
    DBL *found;
    int32_t count;
    ErrorCode status = qx::ArrayMode(in.data(), in.size(), intervals, &found, &count);
    if (status == 0 && count > 0) {
        status = out.resize(count);
        if (status == 0)
            std::memcpy(out.data(), found, static_cast<std::size_t>(count) * sizeof(DBL));
    }
    status = qx::Merge(status, qx::ScratchFree(found));
    if (status < 0 || count == 0)
        out.empty();
    return status;
}
