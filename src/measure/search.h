#ifndef QX_MEASURE_SEARCH_H
#define QX_MEASURE_SEARCH_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The next event in a waveform: the first such i from `from` on, or `end`. A bound or a level that
// is NaN is ignored.

// y[i] <= lower or y[i] >= upper.
QX_BY_WIDTH(int32_t, FirstBeyond,
            (const DBL *y, int32_t from, int32_t end, double lower, double upper))

// The same, or y[i] and y[i + 1] lie on opposite sides of a level or on it; y[end] is read.
QX_BY_WIDTH(int32_t, FirstBeyondOrCrossing,
            (const DBL *y, int32_t from, int32_t end, double lower, double upper, double levelA,
             double levelB))

} // namespace qx

#endif
