#include "qx/stats.h"

#include "frame/finish.h"
#include "frame/scratch.h"
#include "frame/views.h"
#include "stats/histogram.h"
#include "stats/order.h"

#include <cstring>

namespace {

using qx::ElementType;
using DBLIn = qx::In1D<ElementType::DBL>;
using DBLOut = qx::Out1D<ElementType::DBL>;
using I32Out = qx::Out1D<ElementType::I32>;

ErrorCode HistogramOverRange(const DBLIn &x, const I32Out &counts, const DBLOut &centres) {
    double max, min;
    int32_t maxIndex, minIndex;
    if (const ErrorCode status =
            qx::ArrayMaxMin(x.data(), x.size(), &max, &maxIndex, &min, &minIndex))
        return status;
    return qx::ArrayHistogram(x.data(), x.size(), min, max, counts.data(), centres.data(),
                              counts.size());
}

// The host's records without their padding, in scratch memory.
ErrorCode PackIntervals(HistInterval1D intervals, qx::ScratchBytes &packed) {
    const auto *records = reinterpret_cast<const char *>(*intervals + 1);
    const int32_t count = (*intervals)->dimSize;
    if (const ErrorCode status = packed.allocate(count * int64_t{sizeof(qx::PackedInterval)}))
        return status;
    auto *interval = static_cast<qx::PackedInterval *>(packed.bytes());
    for (int32_t j = 0; j < count; ++j) {
        HistInterval record;
        std::memcpy(&record, records + j * sizeof record, sizeof record);
        interval[j] = {record.lower, record.upper, record.closure};
    }
    return 0;
}

ErrorCode CountInIntervals(const DBLIn &x, HistInterval1D intervals, const I32Out &counts,
                           HistSummary *summary) {
    const int32_t count = (*intervals)->dimSize;
    if (count < 0)
        return ErrSizesDisagree;
    if (const ErrorCode status = counts.resize(count))
        return status;
    qx::ScratchBytes packed;
    if (const ErrorCode status = PackIntervals(intervals, packed))
        return status;
    const auto *interval = static_cast<const qx::PackedInterval *>(packed.bytes());
    const ErrorCode status =
        qx::GeneralHistogram(x.data(), x.size(), interval, count, counts.data(), summary);
    return qx::Merge(status, packed.release());
}

} // namespace

int32_t histgran_head(DBL1D x, const int32_t *bins, I32_1D counts, DBL1D centres, ErrorCode *err) {
    const DBLIn in(x);
    const I32Out outCounts(counts);
    const DBLOut outCentres(centres);
    int32_t hostStatus = 0;
    ErrorCode status = qx::FirstFailed({{in.size() < 1 || *bins < 1, ErrEmptyInput}});
    if (status == 0) {
        hostStatus = outCounts.reshape(*bins);
        if (hostStatus == 0)
            hostStatus = outCentres.reshape(*bins);
        status = hostStatus == 0 ? HistogramOverRange(in, outCounts, outCentres) : ErrOutOfMemory;
    }
    qx::Report(err, qx::Finish(status, outCounts, outCentres));
    return hostStatus; // kept: the host's own status is the function result
}

int32_t GenHistH(DBL1D x, HistInterval1D intervals, I32_1D counts, HistSummary *summary,
                 ErrorCode *err) {
    const I32Out out(counts);
    const ErrorCode status = CountInIntervals(DBLIn(x), intervals, out, summary);
    if (status < 0)
        *summary = {0, 0, 0};
    return qx::Report(err, qx::Finish(status, out));
}
