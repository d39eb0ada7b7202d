#ifndef QX_FFT_KERNELS_H
#define QX_FFT_KERNELS_H

#include "fft/plan.h"
#include "frame/widths.h"

#include <cstddef>

namespace qx {

// The radices with kernels of their own, in the order in which lengths are divided by them.
constexpr int32_t kernelRadices[] = {10, 43, 41, 37, 32, 31, 29, 19, 18, 17, 16,
                                     14, 13, 11, 9,  8,  7,  5,  4,  3,  2};

// The columns of a leaf: a rectangle of transforms, number (a, b) with its input at
// a inStride[0] + b inStride[1] and its output at a outStride[0] + b outStride[1]. Value j of a
// transform is j legStride behind its first.
struct LeafColumns {
    std::ptrdiff_t count[2];
    std::ptrdiff_t inStride[2];
    std::ptrdiff_t outStride[2];
    std::ptrdiff_t legStride;
};

// So many transforms of neighbouring inputs run together where the length allows it.
constexpr int leafBundle = 8;

// The kernels of one radix. The first four take any strides. The others run in SIMD lanes: complex
// data is interleaved, results lie side by side, and twiddles come from the lane tables. Both give
// the same bits.
struct KernelSet {
    RealLeaf realLeaf;
    RealTwiddle realTwiddle;
    ComplexLeaf complexLeaf;
    ComplexTwiddle complexTwiddle;

    void (*realLanesLeaf)(const DBL *in, DBL *out, const LeafColumns &columns);
    void (*realLanesTwiddle)(const DBL *in, std::ptrdiff_t inLeg, DBL *out, const FFTStage &stage,
                             std::ptrdiff_t m);
    void (*complexLanesLeaf)(const DBL *in, DBL *out, const LeafColumns &columns);
    void (*complexLanesTwiddle)(const DBL *in, std::ptrdiff_t inLeg, DBL *out,
                                const FFTStage &stage, std::ptrdiff_t m);
};

// The kernels of one of kernelRadices.
QX_BY_WIDTH(const KernelSet *, KernelsOf, (int32_t radix))
// The transforms of one length in one call.
QX_BY_WIDTH(WholeTransform, WholeOf, (int32_t length))

namespace QX_WIDTH {
template <int P>
const KernelSet *KernelsFor();
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
QX_BY_WIDTH(int64_t, ComplexLanesSize, (int32_t p, int32_t m))
QX_BY_WIDTH(int64_t, RealLanesSize, (int32_t p, int32_t m))
QX_BY_WIDTH(void, FillComplexLanes, (const FFTStage &stage, int32_t p, int32_t m, DBL *lanes))
QX_BY_WIDTH(void, FillRealLanes, (const FFTStage &stage, int32_t p, int32_t m, DBL *lanes))

} // namespace qx

#endif
