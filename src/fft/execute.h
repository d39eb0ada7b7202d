#ifndef QX_FFT_EXECUTE_H
#define QX_FFT_EXECUTE_H

#include "fft/plan.h"

#include <cstddef>

namespace qx {

// The forward transforms of a plan's own length, with work memory of the plan's complexWork or
// realWork values. They cannot fail. Strides inside the engine are as wide as addresses, because those
// of inner stages are products of lengths.
void ExecuteComplex(const FFTPlan &plan, const DBL *inRe, const DBL *inIm, DBL *outRe, DBL *outIm,
                    std::ptrdiff_t inStride, std::ptrdiff_t outStride, DBL *work);
void ExecuteReal(const FFTPlan &plan, const DBL *in, DBL *out, std::ptrdiff_t inStride,
                 std::ptrdiff_t outStride, DBL *work);

} // namespace qx

#endif
