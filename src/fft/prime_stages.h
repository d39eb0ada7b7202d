#ifndef QX_FFT_PRIME_STAGES_H
#define QX_FFT_PRIME_STAGES_H

#include "fft/plan.h"

#include <cstddef>

namespace qx {

// The leaf and the twiddle stage of a prime factor without a kernel, of either kind, with the
// contracts of the kernels. `work` has as many values as the two sizes below tell, for a plain sum
// none.

// One of the two factors of these stages: p with its kind and its tables.
struct PrimeFactor {
    int32_t p;
    int32_t kind;
    const FFTStage *stage;
};

// Of complex and of real data, as leaf or as twiddle stage, with that of the plan inside.
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
