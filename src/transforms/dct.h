#ifndef QX_TRANSFORMS_DCT_H
#define QX_TRANSFORMS_DCT_H

#include "fft/plan.h"
#include "frame/views.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Orthonormal discrete cosine transform, type II, and its inverse, type III:
// X[k] = c(k) sqrt(2/n) sum over j of x[j] cos(pi k (2j+1) / (2n)), c(0) = 1/sqrt(2), else 1.
//
// Even lengths run the reordering method on a transform of n values (J. Makhoul, "A fast cosine
// transform in one and two dimensions", 1980), odd lengths the mirror method on 2n.

// The length of the plan that a transform of n values needs. Exceeds int32 for large odd n.
inline int64_t DCTPlanLength(int32_t n) { return n % 2 == 0 ? int64_t{n} : 2 * int64_t{n}; }

// The size of the work buffer, in values.
inline int64_t DCTForwardWork(int32_t n) { return n % 2 == 0 ? 2 * int64_t{n} : 4 * int64_t{n}; }
inline int64_t DCTInverseWork(int32_t n) { return 4 * int64_t{n}; }

// The output has n values, and the plan is one for n. The forward transform takes the first n values
// of the input, with zeros after its end if it is shorter; the inverse takes n values. Input and
// output may be the same memory. ErrOutOfMemory.
ErrorCode DCTForward(const FFTPlan *plan, ConstRealVector in, RealVector out, DBL *work);
ErrorCode DCTInverse(const FFTPlan *plan, ConstRealVector in, RealVector out, DBL *work);

} // namespace qx

#endif
