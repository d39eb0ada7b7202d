#ifndef QX_FFT_KERNELS_H
#define QX_FFT_KERNELS_H

#include "fft/plan.h"

namespace qx {

// The radices with kernels of their own, in the order in which lengths are divided by them.
inline constexpr int32_t kernelRadices[] = {10, 43, 41, 37, 32, 31, 29, 19, 18, 17, 16,
                                            14, 13, 11, 9,  8,  7,  5,  4,  3,  2};

struct KernelSet {
    RealLeaf realLeaf;
    RealTwiddle realTwiddle;
    ComplexLeaf complexLeaf;
    ComplexTwiddle complexTwiddle;
};

// The kernels of one of kernelRadices.
const KernelSet &KernelsOf(int32_t radix);

} // namespace qx

#endif
