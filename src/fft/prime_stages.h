#ifndef QX_FFT_PRIME_STAGES_H
#define QX_FFT_PRIME_STAGES_H

#include "fft/plan.h"

#include <cstddef>

namespace qx {

// The leaf and the twiddle stage of a prime factor without a kernel, of either kind, with the
// contracts of the kernels. They work in scratch memory and can only fail with ErrOutOfMemory.

// One of the two factors of these stages: p with its kind and its tables.
struct PrimeFactor {
    int32_t p;
    int32_t kind;
    const FFTStage *stage;
};

ErrorCode PrimeComplexLeaf(const PrimeFactor &factor, const DBL *inRe, const DBL *inIm, DBL *outRe,
                           DBL *outIm, std::ptrdiff_t inStride, std::ptrdiff_t outStride,
                           int32_t count);
ErrorCode PrimeRealLeaf(const PrimeFactor &factor, const DBL *in, DBL *out, std::ptrdiff_t inStride,
                        std::ptrdiff_t outStride, int32_t count);
ErrorCode PrimeComplexTwiddle(const PrimeFactor &factor, DBL *re, DBL *im, std::ptrdiff_t stride,
                              int32_t m);
ErrorCode PrimeRealTwiddle(const PrimeFactor &factor, DBL *data, std::ptrdiff_t stride, int32_t m);

} // namespace qx

#endif
