#ifndef QX_FFT_PRIME_STAGES_H
#define QX_FFT_PRIME_STAGES_H

#include "fft/plan.h"

#include <cstddef>

namespace qx {

// The leaf and the twiddle stage of a prime factor without a kernel, of either kind, with the
// contracts of the kernels. `work` has PrimeComplexWork or PrimeRealWork values; a plain sum needs
// none.

// A factor of these stages: p with its kind and its tables.
struct PrimeFactor {
    int32_t p;
    int32_t kind;
    const FFTStage *stage;
};

// The work memory for complex and for real data, as leaf or as twiddle stage, including that of the
// Rader plan.
int64_t PrimeComplexWork(const PrimeFactor &factor, bool isLeaf);
int64_t PrimeRealWork(const PrimeFactor &factor, bool isLeaf);

void PrimeComplexLeaf(const PrimeFactor &factor, const DBL *inRe, const DBL *inIm, DBL *outRe,
                      DBL *outIm, std::ptrdiff_t inStride, std::ptrdiff_t outStride, int32_t count,
                      DBL *work);
void PrimeRealLeaf(const PrimeFactor &factor, const DBL *in, DBL *out, std::ptrdiff_t inStride,
                   std::ptrdiff_t outStride, int32_t count, DBL *work);
void PrimeComplexTwiddle(const PrimeFactor &factor, DBL *re, DBL *im, std::ptrdiff_t stride,
                         int32_t m, DBL *work);
void PrimeRealTwiddle(const PrimeFactor &factor, DBL *data, std::ptrdiff_t stride, int32_t m,
                      DBL *work);

} // namespace qx

#endif
