#ifndef QX_MEASURE_SEARCH_H
#define QX_MEASURE_SEARCH_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Where a waveform does something next: the first i from `from` on, or `end`. A bound or a level
// that is NaN is none.

// y[i] <= lower or y[i] >= upper.
QX_BY_WIDTH(int32_t, FirstBeyond,
            (const DBL *y, int32_t from, int32_t end, double lower, double upper))

// The same, or y[i] and y[i + 1] stand on both sides of a level or on it; y[end] is read.
QX_BY_WIDTH(int32_t, FirstBeyondOrCrossing,
            (const DBL *y, int32_t from, int32_t end, double lower, double upper, double levelA,
             double levelB))

} // namespace qx

#endif
