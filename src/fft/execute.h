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

// The complex transforms of `count` neighbouring columns of a matrix, read where they are: value j of
// column c is at in + 2 (j inPitch + c), and its results are contiguous from out + 2 c outPitch on.
// Returns false, and does nothing, if the plan does not run in lanes.
bool ExecuteComplexColumns(const FFTPlan &plan, const DBL *in, std::ptrdiff_t inPitch, DBL *out,
                           std::ptrdiff_t outPitch, std::ptrdiff_t count, DBL *work);

} // namespace qx

#endif
