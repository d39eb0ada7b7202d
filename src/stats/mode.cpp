#include "stats/mode.h"

#include "frame/scratch.h"
#include "stats/histogram.h"
#include "stats/order.h"

#include <cmath>
#include <limits>

namespace qx {

namespace {

constexpr double epsilon = 2.220446049250313e-16;

// A growing list of modes at the front of a block that is still being read further back.
struct ModeList {
    DBL *values;
    int32_t best;  // how often they occur
    int32_t count; // of modes

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

// The block trimmed to its modes, or freed where nothing occurs more than once.
ErrorCode HandOver(void *block, const ModeList &list, DBL **modes, int32_t *count) {
    if (list.best <= 1)
        return ScratchFree(block);
    const auto bytes = static_cast<int32_t>(list.count * int64_t{sizeof(DBL)});
    const ErrorCode status = ScratchRealloc(&block, bytes);
    if (status < 0) {
        ScratchFree(block); // a block that becomes smaller is never lost
        return status;
    }
    *modes = static_cast<DBL *>(block);
    *count = list.count;
    return status;
}

ErrorCode AllocateValues(int32_t count, void **block) {
    constexpr int32_t most = std::numeric_limits<int32_t>::max() / int32_t{sizeof(DBL)};
    return count > most ? ErrOutOfMemory
                        : ScratchAlloc(block, count * static_cast<int32_t>(sizeof(DBL)));
}

ErrorCode SingleMode(double value, DBL **modes, int32_t *count) {
    void *block;
    if (const ErrorCode status = AllocateValues(1, &block))
        return status;
    *modes = static_cast<DBL *>(block);
    **modes = value;
    *count = 1;
    return 0;
}

ErrorCode BinnedMode(const DBL *x, int32_t n, int32_t intervals, DBL **modes, int32_t *count) {
    double max, min;
    int32_t maxIndex, minIndex;
    if (const ErrorCode status = ArrayMaxMin(x, n, &max, &maxIndex, &min, &minIndex))
        return status;
    if (std::fabs(max - min) <= std::fabs(max) * epsilon)
        return SingleMode(max, modes, count);

    Scratch<ElementType::I32> counts;
    if (const ErrorCode status = counts.allocate(intervals))
        return status;
    void *centres;
    if (const ErrorCode status = AllocateValues(intervals, &centres))
        return status;
    DBL *centre = static_cast<DBL *>(centres);
    ErrorCode status = ArrayHistogram(x, n, min, max, counts.data(), centre, intervals);
    if (status < 0) {
        ScratchFree(centres);
        return status;
    }
    ModeList list = {centre, 0, 0};
    for (int32_t bin = 0; bin < intervals; ++bin)
        list.offer(centre[bin], counts[bin]);
    status = HandOver(centres, list, modes, count);
    return Merge(status, counts.release());
}

ErrorCode ExactMode(const DBL *x, int32_t n, DBL **modes, int32_t *count) {
    void *block;
    if (const ErrorCode status = AllocateValues(n, &block))
        return status;
    DBL *a = static_cast<DBL *>(block); // auto would drop the alignment
    SortAscending(x, n, 0, a);
    if (std::fabs(a[0] - a[n - 1]) <= std::fabs(a[0]) * epsilon) {
        const ModeList single = {a, n, 1};
        return HandOver(block, single, modes, count);
    }
    // NaNs stand at the front; each ends its run at once, since it compares false.
    ModeList list = {a, 1, 0};
    for (int32_t i = 0; i < n;) {
        const double value = a[i];
        const double tolerance = std::fabs(value) * epsilon;
        int32_t run = 1;
        while (i + run < n && std::fabs(a[i + run] - value) <= tolerance)
            ++run;
        if (run > 1)
            list.offer(value, run);
        i += run;
    }
    return HandOver(block, list, modes, count);
}

} // namespace

ErrorCode ArrayMode(const DBL *x, int32_t n, int32_t intervals, DBL **modes, int32_t *count) {
    *modes = nullptr;
    *count = 0;
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    return intervals > 0 ? BinnedMode(x, n, intervals, modes, count)
                         : ExactMode(x, n, modes, count);
}

} // namespace qx
