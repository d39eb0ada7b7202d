#ifndef QX_MEASURE_PARABOLAS_H
#define QX_MEASURE_PARABOLAS_H

#include "frame/widths.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Parabolas c0 + c1 t + c2 t^2 fitted to windows of w samples, with t measured from the centre of
// the window.
//
// The operator has 3 rows of w elements, one row for each coefficient. A coefficient is the product
// of its row and the window, summed in the order of the samples; the lanes hold different windows.

struct Parabola {
    double c0, c1, c2;
};

// ErrOutOfMemory, ErrNonFiniteInput, ErrIterationLimit.
ErrorCode BuildFitMatrix(int32_t w, DBL *fitMatrix);

inline Parabola FitWindow(const DBL *fitMatrix, int32_t w, const DBL *window) {
    const DBL *const row0 = fitMatrix;
    const DBL *const row1 = row0 + w;
    const DBL *const row2 = row1 + w;
    Parabola p = {row0[0] * window[0], row1[0] * window[0], row2[0] * window[0]};
    for (int32_t j = 1; j < w; ++j) {
        p.c0 += row0[j] * window[j];
        p.c1 += row1[j] * window[j];
        p.c2 += row2[j] * window[j];
    }
    return p;
}

// Slopes up to this size count as 0; the curvature then decides whether the data is rising.
constexpr double smallestSlope = 1e-10;

inline bool IsRising(const Parabola &p) {
    return -smallestSlope <= p.c1 && p.c1 <= smallestSlope ? p.c2 > 0 : p.c1 > 0;
}

// Windows are tested in groups of up to this many: bit k of a mask is for the window at x + k.
constexpr int32_t maskWidth = 64;

// IsRising of `count` windows.
QX_BY_WIDTH(uint64_t, RisingWindows, (const DBL *fitMatrix, int32_t w, const DBL *x, int32_t count))

// Whether |c1| < reach * sign * c2, that is whether the curvature has the given sign and the vertex
// lies within half of `reach` of the centre, and whether its amplitude can be beyond the threshold,
// in the direction opposite to the sign. `reach` is below 2, w is 3 or 4.
QX_BY_WIDTH(uint64_t, NarrowWindowsAtVertex,
            (const DBL *fitMatrix, int32_t w, const DBL *x, int32_t count, double reach,
             double sign, double threshold))

// What is asked of the vertices of narrow windows, w = 3 or 4, and where they are.
struct VertexLimits {
    double position, centre; // of the window at x, and half its length
    double reach;            // of a vertex from the centre of its window
    double smallestCurvature;
    double sign; // that the curvature is to have
    double threshold, mean;
};
// Those of `count` windows, in ascending order; behind them whatever a vector leaves.
struct FoundVertices {
    static constexpr int32_t windows = 8 * maskWidth; // at most
    static constexpr int32_t length = windows + 8;
    int32_t count;
    DBL locations[length], amplitudes[length], curvatures[length];
};

// The vertices of the windows whose bits are set in `masks`. False where the windows have to be judged
// one by one, since some may take the vertex of the one before.
QX_BY_WIDTH(bool, FindVertices,
            (const DBL *fitMatrix, int32_t w, const DBL *x, const uint64_t *masks, int32_t count,
             const VertexLimits *limits, FoundVertices *found))

// Of up to maskWidth extrema those that stay in *kept, of two less than a sample apart the more extreme
// one, or the first of equals. False where more than two are that close, or the first to the one before
// it at lastLocation. Eight elements behind the last are read.
QX_BY_WIDTH(bool, KeptOfClose,
            (const DBL *locations, const DBL *amplitudes, int32_t count, double sign,
             double lastLocation, uint64_t *kept))

} // namespace qx

#endif
