#ifndef QX_TRANSFORMS_HARTLEY_H
#define QX_TRANSFORMS_HARTLEY_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// In place on n values, each with a plan reference of its own: cheap while some plan slot keeps
// the length in the cache. ErrEmptyInput, ErrOutOfMemory.

// H[k] = sum over j of x[j] (cos(2 pi j k / n) + sin(2 pi j k / n)); the inverse is the same
// transform scaled by 1/n.
ErrorCode FastHartley(DBL *x, int32_t n);
ErrorCode FastHartleyInverse(DBL *x, int32_t n);

// The signal whose spectrum is -i sign(frequency) X, with the zero and the Nyquist frequency
// dropped; the inverse is its negative.
ErrorCode FastHilbert(DBL *x, int32_t n);
ErrorCode FastHilbertInverse(DBL *x, int32_t n);

} // namespace qx

#endif
