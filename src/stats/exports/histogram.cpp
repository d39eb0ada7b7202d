#include "stats/histogram.h"

#include "frame/export.h"
#include "qx/histogram.h"
#include "stats/order.h"

namespace qx {

template <>
struct HandleTraits<HistInterval1D> : RecordHandle<HistInterval> {};
template <>
inline constexpr bool FailsToZero<HistSummary> = true;

namespace {

Outcome OverOwnRange(In<DBL1D> x, int32_t bins, Out<I32_1D> counts, Out<DBL1D> centres) {
    if (x.isEmpty() || bins < 1)
        return ErrEmptyInput;
    if (const Outcome bad = counts.resize(bins))
        return bad;
    if (const Outcome bad = centres.resize(bins))
        return bad;
    Extremes range;
    if (const ErrorCode failed = ArrayMaxMin(x.view(), &range))
        return failed;
    return ArrayHistogram(x.view(), range.min, range.max, counts.view(), centres.view());
}

// Copies the host's records, which start at any byte, without their padding into scratch memory.
ErrorCode PackIntervals(const In<HistInterval1D> &intervals, ScratchBytes &packed) {
    const auto *records = reinterpret_cast<const char *>(intervals.data());
    if (const ErrorCode failed =
            packed.allocate(intervals.size() * int64_t{sizeof(PackedInterval)}))
        return failed;
    auto *interval = static_cast<PackedInterval *>(packed.bytes());
    for (int32_t j = 0; j < intervals.size(); ++j) {
        HistInterval record;
        std::memcpy(&record, records + j * sizeof record, sizeof record);
        interval[j] = {record.lower, record.upper, record.closure};
    }
    return 0;
}

Outcome InIntervals(In<DBL1D> x, In<HistInterval1D> intervals, Out<I32_1D> counts,
                    OutValue<HistSummary> summary) {
    if (intervals.hasNegativeSize())
        return ErrSizesDisagree;
    if (const Outcome bad = counts.resize(intervals.size()))
        return bad;
    ScratchBytes packed;
    if (const ErrorCode failed = PackIntervals(intervals, packed))
        return failed;
    const ErrorCode status =
        GeneralHistogram(x.view(), static_cast<const PackedInterval *>(packed.bytes()),
                         counts.view(), summary.address());
    return Merge(status, packed.release());
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::InErrWithHost;

int32_t histgran_head(DBL1D x, const int32_t *bins, I32_1D counts, DBL1D centres, ErrorCode *err) {
    return InErrWithHost(err, qx::OverOwnRange, x, *bins, counts, centres);
}

int32_t GenHistH(DBL1D x, HistInterval1D intervals, I32_1D counts, HistSummary *summary,
                 ErrorCode *err) {
    return InErr(err, qx::InIntervals, x, intervals, counts, summary);
}
