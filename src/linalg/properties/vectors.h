#ifndef QX_LINALG_PROPERTIES_VECTORS_H
#define QX_LINALG_PROPERTIES_VECTORS_H

#include "qx/types.h"

#include <cstdint>

namespace qx {

// The p-norm (sum |x[i]|^p)^(1/p); for p = +infinity the largest and for -infinity the smallest
// |x[i]|. With `scaleToUnit` x is divided by a norm that is finite and not 0.
// ErrEmptyInput, ErrNonFiniteInput (p is NaN), ErrTooFewWeights (p is 0).
ErrorCode VectorNorm(DBL *x, int32_t n, double p, DBL *norm, int32_t scaleToUnit);
ErrorCode VectorNorm(CDB *x, int32_t n, double p, DBL *norm, int32_t scaleToUnit);

} // namespace qx

#endif
