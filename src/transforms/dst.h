#ifndef QX_TRANSFORMS_DST_H
#define QX_TRANSFORMS_DST_H

#include "fft/plan.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Discrete sine transform, type I, unscaled, and its inverse:
// X[k] = sum over j of x[j] sin(pi (j+1) (k+1) / (n+1)); the inverse is the same sum times
// 2/(n+1). Both are the imaginary part of the transform of the odd extension to 2n+2 values.

// The length of the plan that a transform of n values needs. Exceeds int32 for large n.
inline int64_t DSTPlanLength(int32_t n) { return 2 * int64_t{n} + 2; }

// The size of the work buffer, in values.
inline int64_t DSTWork(int32_t n) { return 4 * (int64_t{n} + 1); }

// Strides count values. The forward transform takes the first n values of the input, with zeros
// behind its end where n exceeds inCount; the inverse has no such window. Input and output may
// be the same memory.
//
// ErrEmptyInput, ErrFFTSizeNotPositive, ErrInternal for a plan of another length,
// ErrOutOfMemory.
ErrorCode DSTForward(const FFTPlan *plan, const DBL *in, int32_t inCount, DBL *out,
                     int32_t inStride, int32_t outStride, int32_t n, DBL *work);
ErrorCode DSTInverse(const DBL *in, DBL *out, int32_t inStride, int32_t outStride, int32_t n,
                     DBL *work, const FFTPlan *plan);

} // namespace qx

#endif
