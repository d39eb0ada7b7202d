#ifndef QX_FFT_KERNELS_H
#define QX_FFT_KERNELS_H

#include "fft/plan.h"
#include "frame/widths.h"

#include <cstddef>

namespace qx {

// The radices with kernels of their own, in the order in which lengths are divided by them.
constexpr int32_t kernelRadices[] = {10, 43, 41, 37, 32, 31, 29, 19, 18, 17, 16,
                                     14, 13, 11, 9,  8,  7,  5,  4,  3,  2};

// So many transforms of neighbouring inputs run together where the length allows it.
constexpr int leafBundle = 8;

// The kernels of one radix: four that take any strides, and the loops in lanes. Both give the same
// bits.
struct KernelSet {
    RealLeaf realLeaf;
    RealTwiddle realTwiddle;
    ComplexLeaf complexLeaf;
    ComplexTwiddle complexTwiddle;
    LanesPasses lanes;
};

// The kernels of one of kernelRadices, and its loops in as many lanes as are fastest for a stage of m
// columns; 0 for the leaf.
QX_BY_WIDTH(const KernelSet *, KernelsOf, (int32_t radix))
QX_BY_WIDTH_TO_8(LanesPasses, PassesOf, (int32_t radix, int32_t m))
// The transforms of one length in one call.
QX_BY_WIDTH(WholeTransform, WholeOf, (int32_t length))

namespace QX_WIDTH {
template <int P>
const KernelSet *KernelsFor();
// The loops of complex data in eight lanes in the place of those of four.
template <int P>
void TakeWidePasses(LanesPasses &passes);
// One transform, interleaved and side by side.
template <int P>
void ComplexSideBySide(const DBL *in, DBL *out);
template <int P>
void RealSideBySide(const DBL *in, DBL *out);
} // namespace QX_WIDTH

// The lane tables hold the twiddles of a stage with factor p in the order in which the kernels read
// them: block after block of columns, as many as fill the lanes, and in a block entry by entry of
// j from 1 to p - 1. The complex table starts at column 0 and has packed entries; the real one has
// columns 1 to (m - 1) / 2, for the rest mirrors them, in an entry all cosines, then all sines.
// Columns that fill no block are left out.
int64_t ComplexLanesSize(const LanesPasses &passes, int32_t p, int32_t m);
int64_t RealLanesSize(const LanesPasses &passes, int32_t p, int32_t m);
void FillComplexLanes(const FFTStage &stage, int32_t p, int32_t m, DBL *table);
void FillRealLanes(const FFTStage &stage, int32_t p, int32_t m, DBL *table);

} // namespace qx

#endif
