#ifndef QX_FFT_KERNELS_H
#define QX_FFT_KERNELS_H

#include "fft/plan.h"
#include "frame/widths.h"

#include <cstddef>

namespace qx {

// The radices that have kernels, in the order in which lengths are divided by them.
constexpr int32_t kernelRadices[] = {10, 43, 41, 37, 32, 31, 29, 19, 18, 17, 16,
                                     14, 13, 11, 9,  8,  7,  5,  4,  3,  2};

// The number of transforms of neighbouring inputs that run together where the length allows it: 128
// bytes of each row.
constexpr int complexBundle = 8;
constexpr int realBundle = 16;

// The kernels of one radix: four that take any strides, and the loops in lanes. Both compute the same
// bits.
struct KernelSet {
    RealLeaf realLeaf;
    RealTwiddle realTwiddle;
    ComplexLeaf complexLeaf;
    ComplexTwiddle complexTwiddle;
    LanesPasses lanes;
};

// The kernels of one of kernelRadices, and its loops with the number of lanes that is fastest for a
// stage of m columns; m is 0 for the leaf.
QX_BY_WIDTH(const KernelSet *, KernelsOf, (int32_t radix))
QX_BY_WIDTH_TO_8(LanesPasses, PassesOf, (int32_t radix, int32_t m))
// The transforms of one length in one call.
QX_BY_WIDTH(WholeTransform, WholeOf, (int32_t length))

namespace QX_WIDTH {
template <int P>
const KernelSet *KernelsFor();
// Replace the loops of four lanes by those of eight: for complex data, for the stages of real data, and for
// columns of matrices.
template <int P>
void TakeWideComplex(LanesPasses &passes);
template <int P>
void TakeWideReal(LanesPasses &passes);
template <int P>
void TakeWideAbreast(LanesPasses &passes);
// One transform of contiguous values; complex ones are interleaved.
template <int P>
void ComplexSideBySide(const DBL *in, DBL *out);
template <int P>
void RealSideBySide(const DBL *in, DBL *out);
// Complex columns of a matrix, for a length without a KernelSet.
template <int P>
void ComplexAbreast(const DBL *in, std::ptrdiff_t inLeg, DBL *out, std::ptrdiff_t outLeg,
                    std::ptrdiff_t columns);
} // namespace QX_WIDTH
#ifdef QX_HAS_EIGHT_LANES
namespace avx2 {
template <int P>
const KernelSet *KernelsFor();
}
#endif

// The lane tables hold the twiddles of a stage with factor p in the order in which the kernels read
// them: block after block of columns that fill the lanes, and in a block entry by entry of j from 1 to
// p - 1. The complex table starts at column 0 and has packed entries; the real table has columns 1 to
// (m - 1) / 2, because the rest mirrors them, and in eight lanes column m / 2 too; an entry is all
// cosines, then all sines. Columns that do not fill a block are left out.
int64_t ComplexLanesSize(const LanesPasses &passes, int32_t p, int32_t m);
int64_t RealLanesSize(const LanesPasses &passes, int32_t p, int32_t m);
void FillComplexLanes(const FFTStage &stage, int32_t p, int32_t m, DBL *table);
void FillRealLanes(const FFTStage &stage, int32_t p, int32_t m, DBL *table);

} // namespace qx

#endif
