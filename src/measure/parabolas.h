#ifndef QX_MEASURE_PARABOLAS_H
#define QX_MEASURE_PARABOLAS_H

#include "frame/widths.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Parabolas c0 + c1 t + c2 t^2 fitted to windows of w samples, t from the centre of the window.
//
// The operator has 3 rows of w, one for each coefficient. A coefficient is the product of its row
// and the window, in the order of the samples; lanes are different windows.

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

// Slopes up to here count as none, and the curvature tells whether the data rises.
constexpr double smallestSlope = 1e-10;

inline bool IsRising(const Parabola &p) {
    return -smallestSlope <= p.c1 && p.c1 <= smallestSlope ? p.c2 > 0 : p.c1 > 0;
}

// Windows are judged by so many at once: bit k of a mask tells of the window at x + k.
constexpr int32_t maskWidth = 64;

// IsRising of `count` windows.
QX_BY_WIDTH(uint64_t, RisingWindows, (const DBL *fitMatrix, int32_t w, const DBL *x, int32_t count))

// Whether |c1| < reach * sign * c2, that is whether the curvature has the sign and the vertex lies
// within half of `reach` from the centre; and whether its amplitude can lie beyond the threshold,
// on the side away from the sign. `reach` is below 2, w is 3 or 4.
QX_BY_WIDTH(uint64_t, NarrowWindowsAtVertex,
            (const DBL *fitMatrix, int32_t w, const DBL *x, int32_t count, double reach,
             double sign, double threshold))

} // namespace qx

#endif
