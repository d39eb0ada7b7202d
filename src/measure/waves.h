#ifndef QX_MEASURE_WAVES_H
#define QX_MEASURE_WAVES_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The block of samples that fits of sinusoids work on at a time.
constexpr int32_t waveBlock = 64;

// A phasor at the first sample of a block and the amplitudes of a line.
struct BlockWave {
    double cosAtStart, sinAtStart;
    double cosine, sine;
};

// waves = the wave of a block, from the table of a phasor that is 1 at its first sample: waveBlock
// cosines, waveBlock sines, in both. Subtracts cosine and sine times the wave from `left`.
QX_BY_WIDTH(void, SubtractWave, (const BlockWave &wave, const DBL *table, DBL *waves, DBL *left))

// sums[0 to 3] = left times cosines, left times sines, and both times the place in the block. Each
// is four sums, of every fourth term, which are added at the end.
QX_BY_WIDTH(void, SumByWave, (const DBL *waves, const DBL *left, double *sums))

// The sums of left and of its squares, likewise.
QX_BY_WIDTH(void, SumOfBlock, (const DBL *left, double *sums))

// The sum of a[i] b[i], likewise; n may be 0, and is no multiple of anything.
QX_BY_WIDTH(double, SumOfProducts, (const DBL *a, const DBL *b, int32_t n))

} // namespace qx

#endif
