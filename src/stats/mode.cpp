#include "stats/mode.h"

#include "frame/constants.h"
#include "stats/histogram.h"
#include "stats/order.h"

#include <cmath>
#include <limits>

namespace qx {

namespace {

// A growing list of modes at the front of a block whose later part is still being read.
struct ModeList {
    DBL *values;
    int32_t best;  // how often each of them occurs
    int32_t count; // number of modes

    void offer(double value, int32_t occurrences) {
        if (occurrences < best)
            return;
        if (occurrences > best) {
            best = occurrences;
            count = 0;
        }
        values[count++] = value;
    }
};

typedef Scratch<ElementType::DBL> Values;

// Keeps the modes at the front of their block, or none if none occurs more than once.
ErrorCode KeepModes(const ModeList &list, Values &modes, int32_t *count) {
    if (list.best <= 1)
        return modes.release();
    *count = list.count;
    return modes.resize(list.count);
}

ErrorCode SingleMode(double value, Values &modes, int32_t *count) {
    if (const ErrorCode failed = modes.allocate(1))
        return failed;
    modes[0] = value;
    *count = 1;
    return 0;
}

// If the bins far outnumber the samples, only nonempty bins are stored: their numbers replace the
// samples, and the centres of the fullest bins replace their numbers.
ErrorCode SparselyBinnedMode(ConstRealVector x, const EqualBins &bins, Values &modes,
                             int32_t *count) {
    const auto n = static_cast<int32_t>(x.size());
    if (const ErrorCode failed = modes.allocate(n))
        return failed;
    DBL *const a = modes.data();
    for (int32_t i = 0; i < n; ++i)
        a[i] = bins.of(x[i]);
    SortNaNsFirst({a, n}, SortOrder::Ascending, {a, n});
    ModeList list = {a, 1, 0};
    for (int32_t i = 0, run; i < n; i += run) {
        const double bin = a[i];
        for (run = 1; i + run < n && a[i + run] == bin; ++run) {
        }
        if (run > 1 && bin >= 0.0) // -1 is not a bin
            list.offer(bin, run);
    }
    EqualBins::Centre centre(bins);
    int32_t bin = 0;
    for (int32_t k = 0; list.best > 1 && k < list.count; ++k) {
        for (; bin < a[k]; ++bin)
            centre.next();
        a[k] = centre.value();
    }
    return KeepModes(list, modes, count);
}

// kept: the number of centres that fit into a block of memory, although no such block is allocated
constexpr int32_t mostIntervals = std::numeric_limits<int32_t>::max() / int32_t{sizeof(DBL)};

ErrorCode BinnedMode(ConstRealVector x, int32_t intervals, Values &modes, int32_t *count) {
    Extremes range;
    if (const ErrorCode failed = ArrayMaxMin(x, &range))
        return failed;
    const double max = range.max, min = range.min;
    if (std::fabs(max - min) <= std::fabs(max) * kEpsilon)
        return SingleMode(max, modes, count);
    if (intervals > mostIntervals)
        return ErrOutOfMemory;
    if (intervals / 8 > x.size())
        return SparselyBinnedMode(x, EqualBins(min, max, intervals), modes, count);

    Scratch<ElementType::I32> counts;
    if (const ErrorCode failed = counts.allocate(intervals))
        return failed;
    if (const ErrorCode failed = modes.allocate(intervals))
        return failed;
    DBL *const centre = modes.data();
    if (const ErrorCode failed =
            ArrayHistogram(x, min, max, {counts.data(), intervals}, {centre, intervals}))
        return failed;
    ModeList list = {centre, 0, 0};
    for (int32_t bin = 0; bin < intervals; ++bin)
        list.offer(centre[bin], counts[bin]);
    return Merge(KeepModes(list, modes, count), counts.release());
}

ErrorCode ExactMode(ConstRealVector x, Values &modes, int32_t *count) {
    const auto n = static_cast<int32_t>(x.size());
    if (const ErrorCode failed = modes.allocate(n))
        return failed;
    DBL *const a = modes.data(); // auto would drop the alignment attribute
    SortNaNsFirst(x, SortOrder::Ascending, {a, n});
    if (std::fabs(a[0] - a[n - 1]) <= std::fabs(a[0]) * kEpsilon)
        return KeepModes({a, n, 1}, modes, count);
    // NaNs are at the front; each is a run of its own, because it compares false.
    ModeList list = {a, 1, 0};
    for (int32_t i = 0; i < n;) {
        const double value = a[i];
        const double tolerance = std::fabs(value) * kEpsilon;
        int32_t run = 1;
        while (i + run < n && std::fabs(a[i + run] - value) <= tolerance)
            ++run;
        if (run > 1)
            list.offer(value, run);
        i += run;
    }
    return KeepModes(list, modes, count);
}

} // namespace

ErrorCode ArrayMode(ConstRealVector x, int32_t intervals, Scratch<ElementType::DBL> &modes,
                    int32_t *count) {
    *count = 0;
    if (x.size() <= 1)
        return x.isEmpty() ? ErrEmptyInput : 0;
    return intervals > 0 ? BinnedMode(x, intervals, modes, count) : ExactMode(x, modes, count);
}

} // namespace qx
