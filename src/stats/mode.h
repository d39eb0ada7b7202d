#ifndef QX_STATS_MODE_H
#define QX_STATS_MODE_H

#include "frame/scratch.h"
#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// The most frequent values. With intervals > 0: the centres of the fullest bins of a histogram with
// `intervals` bins; otherwise the values that occur most often, where values within a relative
// distance of the machine epsilon count as equal. `modes` receives *count values in ascending
// order; there is none for a single sample, or if no value occurs twice. ErrEmptyInput,
// ErrOutOfMemory.
ErrorCode ArrayMode(ConstRealVector x, int32_t intervals, Scratch<ElementType::DBL> &modes,
                    int32_t *count);

} // namespace qx

#endif
