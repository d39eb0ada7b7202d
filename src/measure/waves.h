#ifndef QX_MEASURE_WAVES_H
#define QX_MEASURE_WAVES_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The number of samples that fits of sinusoids process at a time.
constexpr int32_t waveBlock = 64;

// A phasor at the first sample of a block and the amplitudes of a line.
struct BlockWave {
    double cosAtStart, sinAtStart;
    double cosine, sine;
};

// Sets `waves` to the wave of a block, computed from the table of a phasor that is 1 at its first
// sample. Both consist of waveBlock cosines and waveBlock sines. Subtracts cosine and sine times
// the wave from `left`.
QX_BY_WIDTH(void, SubtractWave, (const BlockWave &wave, const DBL *table, DBL *waves, DBL *left))

// sums[0 to 3] = left times cosines, left times sines, and both times the index in the block. Each
// consists of four partial sums, of every fourth term, which are added at the end.
QX_BY_WIDTH(void, SumByWave, (const DBL *waves, const DBL *left, double *sums))

// The sums of `left` and of its squares, in the same order.
QX_BY_WIDTH(void, SumOfBlock, (const DBL *left, double *sums))

// The sum of a[i] b[i], in the same order; n may be 0 and need not be a multiple of anything.
QX_BY_WIDTH(double, SumOfProducts, (const DBL *a, const DBL *b, int32_t n))

} // namespace qx

#endif
