#ifndef QX_MULTIRATE_MOVING_SUMS_H
#define QX_MULTIRATE_MOVING_SUMS_H

#include "frame/elements.h"
#include "frame/widths.h"

#include <cstdint>

namespace qx {

// Cascades of moving sums, each with a running value v over the last `width` inputs of its stage.
enum class MovingSum {
    Plain,         // v + x[i] - x[i - width]
    AlternateEven, // x[i] - v - x[i - width]: shifted by half the sampling rate, for an even width
    AlternateOdd,  // x[i] - v + x[i - width]: the same for an odd width
};

// The state of a cascade. Stage k has a ring of its latest `width` inputs at rings[k ringStep], the
// oldest at `position`, and its running value at sums[k sumStep].
template <ElementType Code>
struct MovingSumState {
    typename Element<Code>::type *rings;
    int64_t ringStep;
    typename Element<Code>::type *sums;
    int64_t sumStep;
    int32_t stages;
    int32_t width;
    int32_t position; // in 0 to width - 1; moves on with the samples
};

// Replaces x by the output of the last stage. Each stage outputs v * scale, while v itself remains
// a plain sum. Instances for DBL and CDB.
template <ElementType Code>
void MovingSumStages(MovingSumState<Code> &state, MovingSum kind, double scale,
                     typename Element<Code>::type *x, int32_t n);

// Eight stages from `first` on as one wavefront, in lanes, with the same results, for rings of at
// most wavefrontWidth and blocks of at least wavefrontSamples.
constexpr int wavefrontStages = 8;
constexpr int32_t wavefrontWidth = 256;
constexpr int32_t wavefrontSamples = 64;
QX_BY_WIDTH(void, MovingSumWavefront,
            (const MovingSumState<ElementType::DBL> &state, int32_t first, MovingSum kind,
             double scale, DBL *x, int32_t n))

// Rotates the rings so that the oldest input comes first.
void StraightenRings(MovingSumState<ElementType::DBL> &state);

} // namespace qx

#endif
