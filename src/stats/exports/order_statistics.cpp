#include "stats/order.h"

#include "frame/export.h"
#include "qx/order_statistics.h"
#include "stats/mode.h"

namespace qx {
namespace {

ErrorCode Median(In<DBL1D> x, OutDBL median) { return ArrayMedian(x.view(), median.address()); }

Outcome Mode(In<DBL1D> x, int32_t intervals, Out<DBL1D> modes) {
    Scratch<ElementType::DBL> found;
    int32_t count = 0;
    if (const ErrorCode failed = ArrayMode(x.view(), intervals, found, &count))
        return failed;
    if (count == 0) {
        modes.empty();
        return 0;
    }
    if (const Outcome bad = modes.resize(count))
        return bad;
    std::memcpy(modes.data(), found.data(), static_cast<std::size_t>(count) * sizeof(DBL));
    return found.release();
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

int32_t Median_head(DBL1D x, DBL *median, ErrorCode *err) {
    return InErr(err, qx::Median, x, median);
}

ErrorCode ModeH(DBL1D x, int32_t intervals, DBL1D modes) {
    return Returned(qx::Mode, x, intervals, modes);
}
