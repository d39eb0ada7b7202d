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
QX_BY_WIDTH_TO_8(uint64_t, RisingWindows,
                 (const DBL *fitMatrix, int32_t w, const DBL *x, int32_t count))

// What is asked of the vertices of narrow windows, w = 3 or 4, and where they are.
struct VertexLimits {
    double position, centre; // of the window at x, and half its length
    double reach;            // of a vertex from the centre of its window
    double smallestCurvature;
    double sign; // that the curvature is to have
    double threshold, mean;
};

// Narrow windows are marked in groups of up to eight words of bits.
constexpr int32_t groupWords = 8;
constexpr int32_t groupWidth = groupWords * maskWidth;

// The windows of a group whose vertex may be near the centre and beyond the threshold, and those of
// them whose vertex has to be computed: it may be just beyond a limit, take the place of the vertex of
// the window before, or lie within a sample of another one. The others have vertices that are
// near the centre, beyond the threshold, and a sample or more from all others.
struct VertexMarks {
    uint64_t possible[groupWords], doubtful[groupWords];
};

// Marks `count` windows by the coefficients of their parabolas; all possible ones are doubtful.
QX_BY_WIDTH_TO_8(void, MarkVertices,
                 (const DBL *fitMatrix, int32_t w, const DBL *x, int32_t count,
                  const VertexLimits *limits, VertexMarks *marks))

// Marks windows of three samples by comparing neighbouring samples, which leaves few in doubt. False if
// these are too many, such as with NaN, infinities or tiny differences, and if the threshold may
// exclude any.
QX_BY_WIDTH_TO_8(bool, MarkBySteps,
                 (const DBL *x, int32_t count, const VertexLimits *limits, VertexMarks *marks))

// The vertices of `count` windows of a group, in ascending order. A location is NaN if the vertex is
// beyond a limit.
struct FoundVertices {
    static constexpr int32_t length = groupWidth + 8;
    int32_t count;
    int32_t places[length]; // the numbers of the windows
    DBL locations[length], amplitudes[length];
};

// The vertices of the windows whose bits are set in `count` words. False where the windows have to be
// judged one by one, since some may take the vertex of the one before.
QX_BY_WIDTH_TO_8(bool, FindVertices,
                 (const DBL *fitMatrix, int32_t w, const DBL *x, const uint64_t *masks,
                  int32_t count, const VertexLimits *limits, FoundVertices *found))

// Where the vertices of windows go, `count` in all.
struct VertexLists {
    DBL *locations, *amplitudes, *curvatures;
    int32_t count;
};
// The vertices of all windows whose bits are set in `words` words, which may start at any byte.
QX_BY_WIDTH_TO_8(void, StoreVertices,
                 (const DBL *fitMatrix, int32_t w, const DBL *x, const char *masks, int32_t words,
                  const VertexLimits *limits, VertexLists lists))

// Of up to maskWidth extrema, without those whose location is NaN, those that stay in *kept: of two
// less than a sample apart the more extreme one, or the first of equals. False where this has to be
// judged one by one: where more than two are that close, one of the first to the one before them at
// lastLocation, or two with one between them. Eight elements behind the last are read.
QX_BY_WIDTH_TO_8(bool, KeptOfClose,
                 (const DBL *locations, const DBL *amplitudes, int32_t count, double sign,
                  double lastLocation, uint64_t *kept))

} // namespace qx

#endif
