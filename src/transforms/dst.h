#ifndef QX_TRANSFORMS_DST_H
#define QX_TRANSFORMS_DST_H

#include "fft/plan.h"
#include "frame/views.h"
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

// The output has n values, and the plan is one for n. The forward transform takes the first n values
// of the input, with zeros after its end if it is shorter; the inverse takes n values. Input and
// output may be the same memory. ErrOutOfMemory.
ErrorCode DSTForward(const FFTPlan *plan, ConstRealVector in, RealVector out, DBL *work);
ErrorCode DSTInverse(const FFTPlan *plan, ConstRealVector in, RealVector out, DBL *work);

} // namespace qx

#endif
